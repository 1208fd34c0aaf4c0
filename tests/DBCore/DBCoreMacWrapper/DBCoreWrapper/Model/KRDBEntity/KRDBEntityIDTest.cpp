#include "Model/KRDBEntity/KRDBEntityID.hpp"

#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <type_traits>

#include "KRClasses/KRComposedHashValues.hpp"
#include "KRFoundation/KRError.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRValue.hpp"

namespace {

// Identifiers are made only through the class factory.
static_assert(!std::is_default_constructible_v<KRDBEntityID>);
static_assert(!std::is_constructible_v<KRDBEntityID, int64_t, int64_t>);

uint64_t expectedHash(int64_t entityType, int64_t dbid) {
  const std::array<uint64_t, 2> values{static_cast<uint64_t>(entityType), static_cast<uint64_t>(dbid)};
  return composedHashValues(values.data(), values.size());
}

TEST(KRDBEntityIDTest, KeepsItsTypeAndDatabaseID) {
  const auto entityID = KRDBEntityID::initWithEntityType(3, -9);
  EXPECT_EQ(entityID->entityType(), 3);
  EXPECT_EQ(entityID->dbid(), -9);
}

TEST(KRDBEntityIDTest, IsOnlyMadeByTheFactory) {
  EXPECT_FALSE(std::is_default_constructible_v<KRDBEntityID>);
  EXPECT_FALSE((std::is_constructible_v<KRDBEntityID, int64_t, int64_t>));
  EXPECT_NE(KRDBEntityID::initWithEntityType(1, 1), KRDBEntityID::initWithEntityType(1, 1));
}

TEST(KRDBEntityIDTest, SameTypeAndDatabaseIDAreEqualWithEqualHashes) {
  const auto first = KRDBEntityID::initWithEntityType(1, 42);
  const auto second = KRDBEntityID::initWithEntityType(1, 42);
  EXPECT_TRUE(first->isEqual(second));
  EXPECT_TRUE(second->isEqual(first));
  EXPECT_TRUE(first->isEqualTo(second));
  EXPECT_TRUE(first->isEqualTo(first));
  EXPECT_EQ(first->hash(), second->hash());
}

TEST(KRDBEntityIDTest, CopyIsADistinctEqualObject) {
  const auto original = KRDBEntityID::initWithEntityType(5, 77);
  const auto copy = original->copyWithZone();
  ASSERT_NE(copy, nullptr);
  EXPECT_NE(copy.get(), original.get());
  EXPECT_EQ(copy->entityType(), 5);
  EXPECT_EQ(copy->dbid(), 77);
  EXPECT_TRUE(copy->isEqual(original));
  EXPECT_TRUE(original->isEqualTo(copy));
  EXPECT_EQ(copy->hash(), original->hash());
}

TEST(KRDBEntityIDTest, DifferentTypeWithSameDatabaseIDIsNotEqual) {
  const auto image = KRDBEntityID::initWithEntityType(1, 42);
  const auto collection = KRDBEntityID::initWithEntityType(2, 42);
  EXPECT_FALSE(image->isEqual(collection));
  EXPECT_FALSE(image->isEqualTo(collection));
  EXPECT_FALSE(collection->isEqualTo(image));
}

TEST(KRDBEntityIDTest, SameTypeWithDifferentDatabaseIDIsNotEqual) {
  const auto first = KRDBEntityID::initWithEntityType(1, 42);
  EXPECT_FALSE(first->isEqualTo(KRDBEntityID::initWithEntityType(1, 43)));
  EXPECT_FALSE(first->isEqual(KRDBEntityID::initWithEntityType(1, -42)));
}

TEST(KRDBEntityIDTest, ObjectOfAnotherClassOrNothingIsNotEqual) {
  const auto entityID = KRDBEntityID::initWithEntityType(1, 42);
  EXPECT_FALSE(entityID->isEqual(KRError::errorWithDomain("KRDBEntityIDTest", 42)));
  EXPECT_FALSE(entityID->isEqual(nullptr));
  EXPECT_FALSE(entityID->isEqualTo(nullptr));
}

TEST(KRDBEntityIDTest, HashComposesTypeThenDatabaseID) {
  EXPECT_EQ(KRDBEntityID::initWithEntityType(1, 42)->hash(), expectedHash(1, 42));
  EXPECT_EQ(KRDBEntityID::initWithEntityType(42, 1)->hash(), expectedHash(42, 1));
  EXPECT_EQ(KRDBEntityID::initWithEntityType(13, -1)->hash(), expectedHash(13, -1));
  EXPECT_NE(KRDBEntityID::initWithEntityType(1, 42)->hash(), KRDBEntityID::initWithEntityType(42, 1)->hash());
}

TEST(KRDBEntityIDTest, DescriptionNamesTheObjectThenTypeAndDatabaseID) {
  const auto entityID = KRDBEntityID::initWithEntityType(1, 42);
  EXPECT_EQ(entityID->description(), "<" + entityID->defaultDescription() + ": 1_42>");
  EXPECT_NE(entityID->defaultDescription().find("KRDBEntityID"), std::string::npos);
}

TEST(KRDBEntityIDTest, DescriptionPrintsNegativeValuesWithAMinus) {
  const auto entityID = KRDBEntityID::initWithEntityType(-3, -42);
  EXPECT_EQ(entityID->description(), "<" + entityID->defaultDescription() + ": -3_-42>");
}

TEST(KRDBEntityIDTest, AnswersTypeAndDatabaseIDByKey) {
  const auto entityID = KRDBEntityID::initWithEntityType(3, 1234567890123);
  EXPECT_EQ(entityID->valueForKey("dbid").number().longLongValue(), 1234567890123);
  EXPECT_EQ(entityID->valueForKey("entityType").number().longLongValue(), 3);
}

TEST(KRDBEntityIDTest, OtherKeysRaiseTheUnknownKeyException) {
  const auto entityID = KRDBEntityID::initWithEntityType(3, 4);
  EXPECT_THROW(entityID->valueForKey("hash"), KRException);
}

}  // namespace
