#include "Model/KRDBFilteredEntityFavoriteAliasesFetchRequest/KRDBFilteredEntityFavoriteAliasesFetchRequest.hpp"

#include <gtest/gtest.h>

#include "../KRDBFilteredEntitiesFetchRequest/KRFetchRequestCatalog.hpp"

namespace {

using dbcore::DBEntityFavoriteAlias;
using Ids = KRFetchRequestCatalog::Ids;

class KRDBFilteredEntityFavoriteAliasesFetchRequestTest : public testing::Test {
 protected:
  // Aliases of the images 1 to 4, the odd ones favorite; the alias of image 1 is then marked to delete.
  void SetUp() override {
    std::vector<std::shared_ptr<DBEntityFavoriteAlias>> records;
    for (int64_t original = 1; original <= 4; ++original) {
      auto record = std::make_shared<DBEntityFavoriteAlias>();
      record->orig_type = dbcore::kDBImageType;
      record->orig_id = original;
      record->favorite = original % 2 == 1;
      records.push_back(record);
    }
    catalog.onEngine([&](const KRFetchRequestCatalog::Reactor& reactor) {
      for (const auto& record : records) *reactor << record;
    });
    for (const auto& record : records) ids.push_back(record->id());
    catalog.markFirstToDelete<DBEntityFavoriteAlias>();
  }

  Ids selected() { return catalog.selectedIds<DBEntityFavoriteAlias>(request->selectQuery()); }
  // The aliases whose in-memory test answers yes.
  Ids satisfying() {
    Ids result;
    for (const auto& record : catalog.allRecords<DBEntityFavoriteAlias>()) {
      if (request->isEntitySatisfyingFilterConditions(KRDBEntity::entityWithDBEntity(record))) {
        result.insert(record->id());
      }
    }
    return result;
  }

  KRFetchRequestCatalog catalog;
  std::vector<int64_t> ids;
  std::shared_ptr<KRDBFilteredEntityFavoriteAliasesFetchRequest> request =
      KRDBFilteredEntityFavoriteAliasesFetchRequest::init();
};

TEST_F(KRDBFilteredEntityFavoriteAliasesFetchRequestTest, TheRequestIsOverFavoriteAliases) {
  EXPECT_EQ(request->entityType(), 9);
  EXPECT_TRUE(std::dynamic_pointer_cast<dbcore::DBEntityFavoriteAliasSelectQuery>(request->selectQuery()));
  EXPECT_EQ(request->selectQuery()->table(), "entity_favorite_aliases");
}

TEST_F(KRDBFilteredEntityFavoriteAliasesFetchRequestTest,
       AnEmptyConditionSelectsEveryAliasNotMarkedToDelete) {
  EXPECT_TRUE(request->condition().isNil());
  catalog.expectSelectsEveryRecordNotMarkedToDelete<DBEntityFavoriteAlias>(*request);
  request->setCondition("");
  catalog.expectSelectsEveryRecordNotMarkedToDelete<DBEntityFavoriteAlias>(*request);
}

TEST_F(KRDBFilteredEntityFavoriteAliasesFetchRequestTest, TheConditionNarrowsTheSelection) {
  request->setCondition("favorite_bool == true");
  EXPECT_EQ(selected(), (Ids{ids[2]}));
  EXPECT_EQ(satisfying(), (Ids{ids[2]}));
  request->setCondition("orig_entity_id_int_64 >= 2 && favorite_bool == false");
  EXPECT_EQ(selected(), (Ids{ids[1], ids[3]}));
  EXPECT_EQ(satisfying(), (Ids{ids[1], ids[3]}));
}

TEST_F(KRDBFilteredEntityFavoriteAliasesFetchRequestTest, ComputedSubExpressionsAreNotExpanded) {
  request->setCondition("orig_entity_id_int_64 == 2");
  EXPECT_EQ(selected(), (Ids{ids[1]}));
  request->setCondition("orig_entity_id_int_64 == $MAT_FUNCTION[1 + 1]");
  EXPECT_EQ(selected(), Ids{});
  EXPECT_EQ(satisfying(), Ids{});
}

TEST_F(KRDBFilteredEntityFavoriteAliasesFetchRequestTest, ARejectedConditionSelectsNothing) {
  for (const char* condition : {"favorite_bool == true &&", "favorite_bool == orig_entity_id_int_64",
                                "favorite_bool == true; DROP TABLE entity_favorite_aliases", "((("}) {
    request->setCondition(condition);
    EXPECT_EQ(selected(), Ids{}) << condition;
    EXPECT_EQ(satisfying(), Ids{}) << condition;
  }
  request->setCondition("favorite_bool == true");
  EXPECT_EQ(selected(), (Ids{ids[2]}));
}

TEST_F(KRDBFilteredEntityFavoriteAliasesFetchRequestTest, OnlyAnotherConditionObjectResetsTheRequest) {
  const KRString condition = "favorite_bool == true";
  request->setCondition(condition);
  const auto query = request->selectQuery();
  request->setCondition(condition);
  EXPECT_EQ(request->selectQuery(), query);
  request->setCondition(KRString("favorite_bool == true"));
  EXPECT_NE(request->selectQuery(), query);
}

TEST_F(KRDBFilteredEntityFavoriteAliasesFetchRequestTest, TheConditionIsAKeyValueProperty) {
  request->setValueForKey(KRString("favorite_bool == false"), "condition");
  EXPECT_EQ(request->condition(), KRString("favorite_bool == false"));
  EXPECT_EQ(request->valueForKey("condition"), KRValue("favorite_bool == false"));
  EXPECT_EQ(selected(), (Ids{ids[1], ids[3]}));
}

}  // namespace
