#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "KREntityObserverRecorder.hpp"
#include "KRRecordPropertyChecks.hpp"
#include "Model/KRDBBaseFolderAttributes/KRDBBaseFolderAttributes.hpp"
#include "dbconstants.hpp"

// The checks that the three folder attribute classes share: Entity is the class, Record its engine record.
template <class Entity, class Record>
struct KRFolderAttributesChecks {
  static constexpr bool kStoresFavorite = requires(Record record) { record.favorite; };

  // A record with "a", the delimiter and "b" as its selected filter types (and favorite set where stored).
  static std::shared_ptr<Record> record() {
    auto result = std::make_shared<Record>();
    result->set_id(4);
    result->selected_filter_types = L"a" + dbcore::kUserConditionsDelimiter + L"b";
    if constexpr (kStoresFavorite) result->favorite = true;
    return result;
  }
  static std::shared_ptr<Entity> entity() { return Entity::initWithDBEntity(record()); }

  static void expectLoadedFromRecord() {
    const auto attributes = entity();
    EXPECT_EQ(attributes->selectedFilterTypes(), KRSet({"a", "b"}));
    EXPECT_EQ(attributes->selectedFilterTypes().count(), 2u);
    EXPECT_EQ(attributes->isFavorite(), kStoresFavorite);
    EXPECT_EQ(attributes->dbattrib(), attributes->dbentity());
  }

  // The store hook takes a fresher record's values.
  static void expectStoreHookReloads() {
    const auto attributes = entity();
    auto fresher = record();
    fresher->selected_filter_types = L"7";
    if constexpr (kStoresFavorite) fresher->favorite = false;
    EXPECT_TRUE(attributes->storeInfoFromDBentity(fresher));
    EXPECT_EQ(attributes->selectedFilterTypes(), KRSet({"7"}));
    EXPECT_FALSE(attributes->isFavorite());
  }

  static KRRecordProperty<Entity> selectedFilterTypesRow() {
    return {"selectedFilterTypes", "kKRDBBaseFolderAttributesDidChangeSelectedFilterTypes",
            [](Entity& attributes) { attributes.setSelectedFilterTypes(KRSet({"c"})); },
            [](const Entity& attributes) { return attributes.dbattrib()->selected_filter_types == L"c"; },
            [](Entity& attributes) { attributes.setSelectedFilterTypes(attributes.selectedFilterTypes()); }};
  }
  static KRRecordProperty<Entity> favoriteRow() {
    return {"favorite", "kKRDBBaseFolderAttributesDidChangeFavorite",
            [](Entity& attributes) { attributes.setFavorite(false); },
            [](const Entity& attributes) { return !attributes.dbattrib()->favorite; },
            [](Entity& attributes) { attributes.setFavorite(false); }};
  }

  // The setter protocol of every stored field.
  static void expectSettersFollowTheProtocol() {
    std::vector<KRRecordProperty<Entity>> rows{selectedFilterTypesRow()};
    if constexpr (kStoresFavorite) rows.push_back(favoriteRow());
    expectSetterProtocol<Entity>(&entity, rows);
  }

  // An equal but distinct set is a change; the same set object is none.
  static void expectSetsComparedByIdentity() {
    const auto attributes = entity();
    const auto observer = KREntityObserverRecorder::observing(*attributes);
    attributes->setSelectedFilterTypes(KRSet({"a", "b"}));
    ASSERT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
    EXPECT_EQ(observer->events[1].info,
              KRDictionary({{"kKRDBBaseFolderAttributesDidChangeSelectedFilterTypes", true}}));
    EXPECT_TRUE(attributes->isDbEntityChanged());
    observer->events.clear();
    attributes->setSelectedFilterTypes(attributes->selectedFilterTypes());
    EXPECT_TRUE(observer->events.empty());
  }
};
