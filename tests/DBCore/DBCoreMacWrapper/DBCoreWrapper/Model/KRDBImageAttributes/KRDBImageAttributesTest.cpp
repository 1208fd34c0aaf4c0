#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "KREntityClassChecks.hpp"
#include "KREntityObserverRecorder.hpp"
#include "KRRecordFieldRows.hpp"
#include "dbexivimgattrib.hpp"

namespace {

using dbcore::DBUserImgAttrib;
using Checks = KREntityClassChecks<KRDBImageAttributes, dbcore::DBUserImgAttrib, dbcore::DBExivImgAttrib>;
using Row = KRRecordProperty<KRDBImageAttributes>;

TEST(KRDBImageAttributesTest, TypeNumbers) {
  EXPECT_EQ(KRDBImageAttributes::entityType(), 5);
  EXPECT_EQ(KRDBImageAttributes::dbEntityType(), 4);
}

TEST(KRDBImageAttributesTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBImageAttributesTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBImageAttributesTest, MarkedToDeleteComesFromTheRecord) {
  Checks::expectMarkedToDeleteTakenFromRecord();
}

TEST(KRDBImageAttributesTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

std::shared_ptr<DBUserImgAttrib> attributesRecord() {
  auto record = std::make_shared<DBUserImgAttrib>();
  record->set_id(21);
  record->image_id = 34;
  record->trashed = true;
  record->marker = 2;
  record->color = 3;
  record->rating = 4;
  record->edit_date = 1000;
  record->opened = true;
  record->trashed_date = -50;
  record->origin_name = L"IMG_\u00e9.CR2";
  record->lost = true;
  record->tutorial = -7;
  return record;
}

std::shared_ptr<KRDBImageAttributes> makeAttributes() {
  return KRDBImageAttributes::initWithDBEntity(attributesRecord());
}

TEST(KRDBImageAttributesTest, TheRecordGivesEveryField) {
  const auto record = attributesRecord();
  const auto attributes = KRDBImageAttributes::initWithDBEntity(record);
  EXPECT_EQ(attributes->dbattrib(), record);
  EXPECT_TRUE(attributes->isTrashed());
  EXPECT_EQ(attributes->marker(), 2);
  EXPECT_EQ(attributes->color(), 3);
  EXPECT_EQ(attributes->rating(), 4);
  EXPECT_EQ(attributes->editDate().timeIntervalSince1970(), 1000.0);
  EXPECT_TRUE(attributes->isOpened());
  EXPECT_EQ(attributes->trashedDate().timeIntervalSince1970(), -50.0);
  EXPECT_EQ(attributes->originName(), KRString("IMG_\u00e9.CR2"));
  EXPECT_TRUE(attributes->isLost());
  EXPECT_EQ(attributes->tutorial(), -7);
  EXPECT_FALSE(attributes->isDbEntityChanged());
}

TEST(KRDBImageAttributesTest, ARecordOfAnotherClassGivesNoTypedRecord) {
  const auto attributes = KRDBImageAttributes::initWithDBEntity(std::make_shared<dbcore::DBExivImgAttrib>());
  ASSERT_TRUE(attributes);
  EXPECT_EQ(attributes->dbattrib(), nullptr);
}

TEST(KRDBImageAttributesTest, TheExportedChangeKeysHoldTheirOwnNames) {
  EXPECT_STREQ(kKRDBImageAttributesDidChangeTrashed, "kKRDBImageAttributesDidChangeTrashed");
  EXPECT_STREQ(kKRDBImageAttributesDidChangeMarker, "kKRDBImageAttributesDidChangeMarker");
  EXPECT_STREQ(kKRDBImageAttributesDidChangeColor, "kKRDBImageAttributesDidChangeColor");
  EXPECT_STREQ(kKRDBImageAttributesDidChangeRating, "kKRDBImageAttributesDidChangeRating");
  EXPECT_STREQ(kKRDBImageAttributesDidChangeEditDate, "kKRDBImageAttributesDidChangeEditDate");
  EXPECT_STREQ(kKRDBImageAttributesDidChangeOpened, "kKRDBImageAttributesDidChangeOpened");
  EXPECT_STREQ(kKRDBImageAttributesDidChangeTrashedDate, "kKRDBImageAttributesDidChangeTrashedDate");
}

// Every record-backed property, with its exact change key (the tutorial and lost keys are posted but not
// exported) and its record conversion: dates truncated toward zero, the tutorial's low 32 bits.
TEST(KRDBImageAttributesTest, EveryRecordFieldFollowsTheSetterProtocol) {
  using A = KRDBImageAttributes;
  using R = DBUserImgAttrib;
  const std::vector<Row> rows{
      recordFieldRow("trashed", "kKRDBImageAttributesDidChangeTrashed", &A::setTrashed, &A::isTrashed, false,
                     &R::trashed, false),
      recordFieldRow("marker", "kKRDBImageAttributesDidChangeMarker", &A::setMarker, &A::marker, 9,
                     &R::marker, 9),
      recordFieldRow("color", "kKRDBImageAttributesDidChangeColor", &A::setColor, &A::color, -1, &R::color,
                     -1),
      recordFieldRow("rating", "kKRDBImageAttributesDidChangeRating", &A::setRating, &A::rating, 5,
                     &R::rating, 5),
      recordFieldRow("editDate", "kKRDBImageAttributesDidChangeEditDate", &A::setEditDate, &A::editDate,
                     KRDate::dateWithTimeIntervalSince1970(1234.9), &R::edit_date, int64_t{1234}),
      recordFieldRow("opened", "kKRDBImageAttributesDidChangeOpened", &A::setOpened, &A::isOpened, false,
                     &R::opened, false),
      recordFieldRow("trashedDate", "kKRDBImageAttributesDidChangeTrashedDate", &A::setTrashedDate,
                     &A::trashedDate, KRDate::dateWithTimeIntervalSince1970(-20.7), &R::trashed_date,
                     int64_t{-20}),
      recordFieldRow("lost", "kKRDBImageAttributesDidChangeLost", &A::setLost, &A::isLost, false, &R::lost,
                     false),
      recordFieldRow("tutorial", "kKRDBImageAttributesDidChangeTutorial", &A::setTutorial, &A::tutorial,
                     int64_t{0x100000005}, &R::tutorial, 5),
  };
  expectSetterProtocol<A>(makeAttributes, rows);
}

TEST(KRDBImageAttributesTest, TheCurrentRatingPostsNothingAndAnotherPostsItsKey) {
  const auto attributes = makeAttributes();
  const auto observer = KREntityObserverRecorder::observing(*attributes);
  attributes->setRating(4);
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(attributes->isDbEntityChanged());
  attributes->setRating(1);
  ASSERT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
  EXPECT_EQ(observer->events[1].info, KRDictionary({{"kKRDBImageAttributesDidChangeRating", true}}));
  EXPECT_EQ(attributes->dbattrib()->rating, 1);
}

TEST(KRDBImageAttributesTest, AnEqualButDistinctDateCountsAsAChange) {
  const auto attributes = makeAttributes();
  const auto observer = KREntityObserverRecorder::observing(*attributes);
  const KRDate equal = KRDate::dateWithTimeIntervalSince1970(1000);
  ASSERT_EQ(equal, attributes->editDate());
  attributes->setEditDate(equal);
  EXPECT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
  EXPECT_TRUE(identical(attributes->editDate(), equal));
}

TEST(KRDBImageAttributesTest, TheTutorialKeepsItsLow32BitsInTheRecord) {
  const auto record = attributesRecord();
  const auto attributes = KRDBImageAttributes::initWithDBEntity(record);
  attributes->setTutorial(4294967297);
  EXPECT_EQ(record->tutorial, 1);
  EXPECT_EQ(attributes->tutorial(), 4294967297);
  EXPECT_EQ(KRDBImageAttributes::initWithDBEntity(record)->tutorial(), 1);
}

TEST(KRDBImageAttributesTest, TheOriginNameIsOnlyKept) {
  const auto record = attributesRecord();
  const auto attributes = KRDBImageAttributes::initWithDBEntity(record);
  const auto observer = KREntityObserverRecorder::observing(*attributes);
  attributes->setOriginName("other.jpg");
  EXPECT_EQ(attributes->originName(), KRString("other.jpg"));
  EXPECT_FALSE(attributes->isDbEntityChanged());
  EXPECT_TRUE(observer->events.empty());
  EXPECT_EQ(record->origin_name, L"IMG_\u00e9.CR2");
}

TEST(KRDBImageAttributesTest, UpdateModificationDateSetsTheEditDateToNow) {
  const auto attributes = makeAttributes();
  const auto observer = KREntityObserverRecorder::observing(*attributes);
  const double before = KRDate::date().timeIntervalSince1970();
  attributes->updateModificationDate();
  const double after = KRDate::date().timeIntervalSince1970();
  EXPECT_GE(attributes->editDate().timeIntervalSince1970(), before);
  EXPECT_LE(attributes->editDate().timeIntervalSince1970(), after);
  EXPECT_EQ(attributes->dbattrib()->edit_date,
            static_cast<int64_t>(attributes->editDate().timeIntervalSince1970()));
  ASSERT_EQ(observer->events.size(), 2u);
  EXPECT_EQ(observer->events[1].info, KRDictionary({{"kKRDBImageAttributesDidChangeEditDate", true}}));
}

TEST(KRDBImageAttributesTest, ResetToDefaultStateUntrashesInOneChangeKeepingTheIdentity) {
  const auto record = attributesRecord();
  const auto attributes = KRDBImageAttributes::initWithDBEntity(record);
  const auto observer = KREntityObserverRecorder::observing(*attributes);
  attributes->resetToDefaultState();
  ASSERT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
  EXPECT_TRUE(observer->events[0].info.isNil());
  EXPECT_TRUE(observer->events[1].info.isNil());
  EXPECT_TRUE(attributes->isDbEntityChanged());
  EXPECT_FALSE(attributes->isTrashed());
  EXPECT_FALSE(record->trashed);
  EXPECT_EQ(attributes->dbattrib(), record);
  EXPECT_EQ(record->id(), 21);
  EXPECT_EQ(record->image_id, 34);
  EXPECT_EQ(attributes->entityID()->dbid(), 21);
  EXPECT_EQ(attributes->rating(), 0);
  EXPECT_EQ(attributes->marker(), 0);
  EXPECT_EQ(attributes->color(), 0);
  EXPECT_FALSE(attributes->isOpened());
  EXPECT_FALSE(attributes->isLost());
  EXPECT_EQ(attributes->tutorial(), 0);
  EXPECT_EQ(attributes->editDate().timeIntervalSince1970(), 0.0);
}

TEST(KRDBImageAttributesTest, ResetToDefaultStateAlsoUnmarksForDeletion) {
  auto record = attributesRecord();
  record->set_marked_to_delete(true);
  const auto attributes = KRDBImageAttributes::initWithDBEntity(record);
  const auto observer = KREntityObserverRecorder::observing(*attributes);
  attributes->resetToDefaultState();
  EXPECT_EQ(observer->kinds(),
            (std::vector<std::string>{"willChange", "didChange", "willChange", "didChange"}));
  EXPECT_EQ(observer->events[1].info, KRDictionary({{"KRDBEntityMarkedToDelete", false}}));
  EXPECT_FALSE(attributes->isMarkedToDelete());
  EXPECT_FALSE(record->marked_to_delete());
}

TEST(KRDBImageAttributesTest, TheImageIsAskedOfTheContextOnFirstRead) {
  expectLazyImage(makeAttributes(), "imageForAttributes");
}

TEST(KRDBImageAttributesTest, TheImageBackReferenceIsWeakAndSilent) {
  expectWeakImagePrimitive(makeAttributes());
}

TEST(KRDBImageAttributesTest, FieldsAreReachedByKey) {
  const auto attributes = makeAttributes();
  EXPECT_EQ(attributes->valueForKey("rating"), KRValue(4));
  EXPECT_EQ(attributes->valueForKey("trashed"), KRValue(true));
  EXPECT_EQ(attributes->valueForKey("originName"), KRValue("IMG_\u00e9.CR2"));
  EXPECT_EQ(attributes->valueForKey("editDate").valueForKey("timeIntervalSince1970"), KRValue(1000.0));
  EXPECT_EQ(attributes->valueForKey("markedToDelete"), KRValue(false));
  attributes->setValueForKey(2, "rating");
  attributes->setValueForKey(false, "lost");
  attributes->setValueForKey(int64_t{4294967297}, "tutorial");
  EXPECT_EQ(attributes->rating(), 2);
  EXPECT_FALSE(attributes->isLost());
  EXPECT_EQ(attributes->tutorial(), 4294967297);
  EXPECT_EQ(attributes->dbattrib()->rating, 2);
}

}  // namespace
