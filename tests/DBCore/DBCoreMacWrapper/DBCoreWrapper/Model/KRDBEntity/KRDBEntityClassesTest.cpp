#include "Model/KRDBEntity/KRDBEntityClasses.hpp"

#include <gtest/gtest.h>

#include <cstdint>
#include <utility>
#include <vector>

#include "KRFoundation/KRException.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "Model/KRDBEntity/KRDBEntity.hpp"
#include "dbresource.hpp"

namespace {

// Record type -> entity type of every class of the layer.
const std::vector<std::pair<uint8_t, int64_t>> kRecordToEntityTypes = {
    {1, 1},  {2, 2},  {7, 3},  {8, 4},   {4, 5},   {5, 6},   {9, 7},
    {10, 8}, {11, 9}, {6, 10}, {12, 11}, {13, 12}, {15, 13},
};

TEST(KRDBEntityClassesTest, EveryRecordTypeMapsToItsEntityType) {
  KRDBEntityClasses::registerAll();
  for (const auto& [recordType, entityType] : kRecordToEntityTypes) {
    const KRDBEntityClass* entityClass = KRDBEntity::entityClassForDBEntityType(recordType);
    ASSERT_NE(entityClass, nullptr) << int(recordType);
    EXPECT_EQ(entityClass->dbEntityType, recordType);
    EXPECT_EQ(entityClass->entityType, entityType) << int(recordType);
    EXPECT_EQ(KRDBEntity::entityTypeForDBEntityType(recordType), entityType) << int(recordType);
  }
}

TEST(KRDBEntityClassesTest, RecordTypesWithoutAClassMapToNothing) {
  KRDBEntityClasses::registerAll();
  for (const uint8_t recordType : {0, 3, 14, 16, 255}) {
    EXPECT_EQ(KRDBEntity::entityClassForDBEntityType(recordType), nullptr) << int(recordType);
    EXPECT_EQ(KRDBEntity::entityTypeForDBEntityType(recordType), KRDBEntityTypeNone) << int(recordType);
  }
  EXPECT_EQ(KRDBEntityTypeNone, 0);
}

TEST(KRDBEntityClassesTest, RegisteringTwiceChangesNothing) {
  KRDBEntityClasses::registerAll();
  const KRDBEntity::ClassMap before = KRDBEntity::dbEntityTypeToClassMap();
  KRDBEntityClasses::registerAll();
  EXPECT_EQ(KRDBEntity::dbEntityTypeToClassMap(), before);
}

TEST(KRDBEntityClassesTest, NoRecordGivesNoEntity) {
  KRDBEntityClasses::registerAll();
  const KRCapturingLogSink log;
  EXPECT_EQ(KRDBEntity::entityWithDBEntity(nullptr), nullptr);
  EXPECT_TRUE(log.records().empty());
}

TEST(KRDBEntityClassesTest, RecordWithoutAClassGivesNoEntityAndLogsOneError) {
  KRDBEntityClasses::registerAll();
  const KRCapturingLogSink log;
  auto resource = std::make_shared<dbcore::DBResource>();
  resource->set_id(5);
  EXPECT_EQ(KRDBEntity::entityWithDBEntity(resource), nullptr);
  const auto records = log.records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].level, KRLogLevelError);
  EXPECT_EQ(records[0].level, 2);
  EXPECT_EQ(records[0].sourcePath, "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBEntity/KRDBEntity");
  EXPECT_EQ(records[0].function, "entityWithDBEntity");
  EXPECT_NE(records[0].message.find("record type 3"), std::string::npos) << records[0].message;
}

// Asks the abstract class for a type number: it must log the missing override at level 1, then raise.
template <class Ask>
void expectMissingOverride(Ask ask, const std::string& name) {
  const KRCapturingLogSink log;
  try {
    ask();
    ADD_FAILURE() << name << " did not raise";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRString(KRException::NSInvalidArgumentException));
    EXPECT_EQ(exception.reason(), KRString("+[KRDBEntity " + name + "]: unrecognized selector"));
  }
  const auto records = log.records();
  ASSERT_EQ(records.size(), 1u) << name;
  EXPECT_EQ(records[0].level, KRLogLevelMissingOverride);
  EXPECT_EQ(records[0].level, 1);
  EXPECT_EQ(records[0].message, "Error: " + name + " should be overrided in subclass");
  EXPECT_EQ(records[0].sourcePath, "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBEntity/KRDBEntity");
}

TEST(KRDBEntityClassesTest, AbstractEntityTypeLogsThenRaises) {
  expectMissingOverride([] { (void)KRDBEntity::entityType(); }, "entityType");
}

TEST(KRDBEntityClassesTest, AbstractRecordTypeLogsThenRaises) {
  expectMissingOverride([] { (void)KRDBEntity::dbEntityType(); }, "dbEntityType");
}

}  // namespace
