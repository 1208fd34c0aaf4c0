#include "Model/KRDBEntity/KRDBDataStorageFactoryBase.hpp"

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>

#include "KRFoundation/KRError.hpp"

namespace {

KRDBEntityIDPtr entityID(int64_t entityType, int64_t dbid) {
  return KRDBEntityID::initWithEntityType(entityType, dbid);
}

// A distinct object to store and find again by identity.
std::shared_ptr<KRObject> marker(const char* name) { return KRError::errorWithDomain(name, 0); }

// Stores type 1 and type 2 under the same dbid.
void storeImageAndCollection(KRDBEntityIDMapTable& table, const std::shared_ptr<KRObject>& image,
                             const std::shared_ptr<KRObject>& collection) {
  table.setObject(image, entityID(1, 42));
  table.setObject(collection, entityID(2, 42));
}

TEST(KRDBDataStorageFactoryBaseTest, TablesStartEmpty) {
  const KRDBDataStorageFactoryBase factory;
  EXPECT_EQ(KRDBDataStorageFactoryBase::mapTableWithObjectsMappedByEntityIDs()->count(), 0u);
  EXPECT_EQ(KRDBDataStorageFactoryBase::mapTableWithObjectsMappedBySameTypeEntityIDs()->count(), 0u);
  EXPECT_EQ(factory.makeMapTableWithObjectsMappedByEntityIDs()->count(), 0u);
  EXPECT_EQ(factory.makeMapTableWithObjectsMappedBySameTypeEntityIDs()->count(), 0u);
}

TEST(KRDBDataStorageFactoryBaseTest, EachCallMakesANewTable) {
  const KRDBDataStorageFactoryBase factory;
  EXPECT_NE(factory.makeMapTableWithObjectsMappedByEntityIDs(),
            factory.makeMapTableWithObjectsMappedByEntityIDs());
  EXPECT_NE(KRDBDataStorageFactoryBase::mapTableWithObjectsMappedBySameTypeEntityIDs(),
            KRDBDataStorageFactoryBase::mapTableWithObjectsMappedBySameTypeEntityIDs());
}

TEST(KRDBDataStorageFactoryBaseTest, MixedTypeTableKeepsBothTypesOfOneDatabaseID) {
  const KRDBDataStorageFactoryBase factory;
  for (const auto& table : {KRDBDataStorageFactoryBase::mapTableWithObjectsMappedByEntityIDs(),
                            factory.makeMapTableWithObjectsMappedByEntityIDs()}) {
    const auto image = marker("image");
    const auto collection = marker("collection");
    storeImageAndCollection(*table, image, collection);
    EXPECT_EQ(table->count(), 2u);
    EXPECT_EQ(table->objectForKey(entityID(1, 42)), image);
    EXPECT_EQ(table->objectForKey(entityID(2, 42)), collection);
    EXPECT_FALSE(table->containsKey(entityID(3, 42)));
    EXPECT_FALSE(table->containsKey(entityID(1, 43)));
  }
}

TEST(KRDBDataStorageFactoryBaseTest, SameTypeTableTreatsOneDatabaseIDAsOneKey) {
  const KRDBDataStorageFactoryBase factory;
  for (const auto& table : {KRDBDataStorageFactoryBase::mapTableWithObjectsMappedBySameTypeEntityIDs(),
                            factory.makeMapTableWithObjectsMappedBySameTypeEntityIDs()}) {
    const auto image = marker("image");
    const auto collection = marker("collection");
    storeImageAndCollection(*table, image, collection);
    EXPECT_EQ(table->count(), 1u);
    EXPECT_EQ(table->objectForKey(entityID(1, 42)), collection);
    EXPECT_EQ(table->objectForKey(entityID(7, 42)), collection);
    EXPECT_FALSE(table->containsKey(entityID(1, 43)));
  }
}

TEST(KRDBDataStorageFactoryBaseTest, LookupsWithAFreshEqualIdentifierFindTheValue) {
  const auto mixed = KRDBDataStorageFactoryBase::mapTableWithObjectsMappedByEntityIDs();
  const auto sameType = KRDBDataStorageFactoryBase::mapTableWithObjectsMappedBySameTypeEntityIDs();
  const auto value = marker("value");
  const auto key = entityID(4, 1000);
  mixed->setObject(value, key);
  sameType->setObject(value, key);
  const auto lookup = entityID(4, 1000);
  ASSERT_NE(lookup, key);
  EXPECT_EQ(mixed->objectForKey(lookup), value);
  EXPECT_EQ(sameType->objectForKey(lookup), value);
  mixed->removeObjectForKey(lookup);
  EXPECT_EQ(mixed->count(), 0u);
}

TEST(KRDBDataStorageFactoryBaseTest, SameTypeHashIsTheDatabaseIDsBits) {
  EXPECT_EQ(KROneTypeEntityIDsHashFunction(entityID(1, -1)), 0xFFFFFFFFFFFFFFFFull);
  EXPECT_EQ(KROneTypeEntityIDsHashFunction(entityID(1, 42)), 42u);
  EXPECT_EQ(KROneTypeEntityIDsHashFunction(entityID(9, 42)), 42u);
  EXPECT_EQ(KROneTypeEntityIDsHashFunction(entityID(1, 0)), 0u);
}

TEST(KRDBDataStorageFactoryBaseTest, ManyTypeEqualityComparesTypeAndDatabaseID) {
  EXPECT_TRUE(KRManyTypeEntityIDsIsEqualFunction(entityID(1, 42), entityID(1, 42)));
  EXPECT_FALSE(KRManyTypeEntityIDsIsEqualFunction(entityID(1, 42), entityID(2, 42)));
  EXPECT_FALSE(KRManyTypeEntityIDsIsEqualFunction(entityID(1, 42), entityID(1, 43)));
  EXPECT_FALSE(KRManyTypeEntityIDsIsEqualFunction(entityID(1, 42), entityID(2, 43)));
}

TEST(KRDBDataStorageFactoryBaseTest, OneTypeEqualityComparesTheDatabaseIDAlone) {
  EXPECT_TRUE(KROneTypeEntityIDsIsEqualFunction(entityID(1, 42), entityID(1, 42)));
  EXPECT_TRUE(KROneTypeEntityIDsIsEqualFunction(entityID(1, 42), entityID(2, 42)));
  EXPECT_FALSE(KROneTypeEntityIDsIsEqualFunction(entityID(1, 42), entityID(1, 43)));
  EXPECT_FALSE(KROneTypeEntityIDsIsEqualFunction(entityID(1, 42), entityID(2, 43)));
}

}  // namespace
