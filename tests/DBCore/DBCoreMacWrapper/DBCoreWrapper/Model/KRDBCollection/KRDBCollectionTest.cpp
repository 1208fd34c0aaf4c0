#include "Model/KRDBCollection/KRDBCollection.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "KRRecordPropertyChecks.hpp"
#include "KRRecordingEntityContext.hpp"
#include "dbsmartfilter.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBCollection, dbcore::DBFilter, dbcore::DBSmartFilter>;

TEST(KRDBCollectionTest, TypeNumbers) {
  EXPECT_EQ(KRDBCollection::entityType(), 2);
  EXPECT_EQ(KRDBCollection::dbEntityType(), 2);
}

TEST(KRDBCollectionTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBCollectionTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBCollectionTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBCollectionTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

std::shared_ptr<KRDBCollection> collection() {
  auto record = std::make_shared<dbcore::DBFilter>();
  record->set_id(6);
  record->name = L"Trip \u00e9t\u00e9";
  record->order = 2.5f;
  return KRDBCollection::initWithDBEntity(record);
}

TEST(KRDBCollectionTest, TheRecordGivesNameAndOrder) {
  const auto folder = collection();
  EXPECT_EQ(folder->name(), KRString("Trip \u00e9t\u00e9"));
  EXPECT_EQ(folder->order(), 2.5);
  EXPECT_EQ(folder->dbfilter(), folder->dbentity());
  EXPECT_EQ(folder->valueForKey("name"), KRValue("Trip \u00e9t\u00e9"));
  EXPECT_EQ(folder->valueForKey("order"), KRValue(2.5));
}

TEST(KRDBCollectionTest, NameAndOrderFollowTheSetterProtocol) {
  expectSetterProtocol<KRDBCollection>(
      &collection,
      {{"name", "kKRDBBaseFolderDidChangeName", [](KRDBCollection& folder) { folder.setName("Renamed"); },
        [](const KRDBCollection& folder) { return folder.dbfilter()->name == L"Renamed"; },
        [](KRDBCollection& folder) { folder.setName(KRString(std::string("Renamed"))); }},
       {"order", "kKRDBBaseFolderDidChangeOrder", [](KRDBCollection& folder) { folder.setOrder(0.1); },
        [](const KRDBCollection& folder) { return folder.dbfilter()->order == 0.1f; },
        [](KRDBCollection& folder) { folder.setOrder(0.1); }}});
}

TEST(KRDBCollectionTest, NoNameIsStoredAsAnEmptyWideString) {
  const auto folder = collection();
  folder->setName(KRString());
  EXPECT_EQ(folder->dbfilter()->name, L"");
  EXPECT_TRUE(folder->name().isNil());
}

TEST(KRDBCollectionTest, TheOrderIsKeptWholeUntilReloaded) {
  const auto folder = collection();
  folder->setOrder(0.1);
  EXPECT_EQ(folder->order(), 0.1);
  EXPECT_TRUE(folder->storeInfoFromDBentity(folder->dbentity()));
  EXPECT_EQ(folder->order(), static_cast<double>(0.1f));
}

TEST(KRDBCollectionTest, ImagesJoinAndLeaveThroughTheContext) {
  const auto folder = collection();
  const auto context = std::make_shared<KRRecordingEntityContext>();
  folder->setContext(context);
  const std::shared_ptr<KRDBEntity> image = collection();
  folder->addImages({image});
  folder->removeImages({image});
  EXPECT_EQ(context->calls, (std::vector<std::string>{"addImages:toFilter:", "deleteImages:fromFilter:"}));
  EXPECT_EQ(context->changedEntities, (std::vector<KRDBEntitySet>{{image}, {image}}));
  EXPECT_EQ(context->changedFolders[0], folder);
  EXPECT_EQ(context->changedFolders[1], folder);
}

}  // namespace
