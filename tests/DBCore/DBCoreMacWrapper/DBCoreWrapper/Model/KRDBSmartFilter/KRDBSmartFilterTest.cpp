#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "KREntityObserverRecorder.hpp"
#include "dbfilter.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBSmartFilter, dbcore::DBSmartFilter, dbcore::DBFilter>;

TEST(KRDBSmartFilterTest, TypeNumbers) {
  EXPECT_EQ(KRDBSmartFilter::entityType(), 11);
  EXPECT_EQ(KRDBSmartFilter::dbEntityType(), 12);
}

TEST(KRDBSmartFilterTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBSmartFilterTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBSmartFilterTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBSmartFilterTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

std::shared_ptr<dbcore::DBSmartFilter> smartFilterRecord() {
  auto record = std::make_shared<dbcore::DBSmartFilter>();
  record->set_id(3);
  record->identifier = L"KRAllImages";
  record->filter_conditions = LR"j({"images":"(rating_int_64 >= 3)"})j";
  record->applying_conditions = LR"j({"attributes":"(flag_int_64 == 1)"})j";
  record->name = L"Best";
  return record;
}

TEST(KRDBSmartFilterTest, TheRecordGivesItsFields) {
  const auto filter = KRDBSmartFilter::initWithDBEntity(smartFilterRecord());
  EXPECT_EQ(filter->identifier(), KRString("KRAllImages"));
  EXPECT_EQ(filter->name(), KRString("Best"));
  EXPECT_EQ(filter->filterConditions(), KRDictionary({{"images", "(rating_int_64 >= 3)"}}));
  EXPECT_EQ(filter->applyingConditions(), KRDictionary({{"attributes", "(flag_int_64 == 1)"}}));
  EXPECT_EQ(filter->dbsmartfilter(), filter->dbentity());
  EXPECT_EQ(filter->valueForKey("identifier"), KRValue("KRAllImages"));
  EXPECT_EQ(filter->valueForKey("filterConditions"), KRValue(filter->filterConditions()));
  EXPECT_EQ(filter->valueForKey("applyingConditions"), KRValue(filter->applyingConditions()));
}

TEST(KRDBSmartFilterTest, TextThatIsNotJsonGivesNoConditions) {
  auto record = smartFilterRecord();
  record->filter_conditions = L"{images:";
  record->applying_conditions = L"";
  const auto filter = KRDBSmartFilter::initWithDBEntity(record);
  EXPECT_TRUE(filter->filterConditions().isNil());
  EXPECT_TRUE(filter->applyingConditions().isNil());
}

TEST(KRDBSmartFilterTest, ConditionTextsAreParsedAsJsonObjects) {
  EXPECT_EQ(KRDBSmartFilter::conditionsDictionaryFromJsonWString(LR"({"k":"\u00e9"})"),
            KRDictionary({{"k", "\u00e9"}}));
  EXPECT_EQ(KRDBSmartFilter::conditionsDictionaryFromJsonWString(L"{}"), KRDictionary::dictionary());
  EXPECT_TRUE(KRDBSmartFilter::conditionsDictionaryFromJsonWString(L"[1]").isNil());
  EXPECT_TRUE(KRDBSmartFilter::conditionsDictionaryFromJsonWString(L"nonsense").isNil());
}

TEST(KRDBSmartFilterTest, TheOrderIsAlwaysZero) {
  auto record = smartFilterRecord();
  const auto filter = KRDBSmartFilter::initWithDBEntity(record);
  EXPECT_EQ(filter->order(), 0.0);
  filter->setOrder(4.0);
  EXPECT_EQ(filter->order(), 0.0);
  EXPECT_EQ(filter->valueForKey("order"), KRValue(0.0));
}

TEST(KRDBSmartFilterTest, TheNameIsStoredWithoutNotification) {
  const auto filter = KRDBSmartFilter::initWithDBEntity(smartFilterRecord());
  const auto observer = KREntityObserverRecorder::observing(*filter);
  filter->setName("Other");
  EXPECT_EQ(filter->name(), KRString("Other"));
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(filter->isDbEntityChanged());
  EXPECT_EQ(filter->dbsmartfilter()->name, L"Best");
}

}  // namespace
