#include "Support/KRDBCoreInjectorService.hpp"

#include <gtest/gtest.h>

#include "KRFoundation/KRError.hpp"
#include "Model/KRDBEntity/KRDBDataStorageFactoryBase.hpp"

namespace {

std::shared_ptr<KRDBDataStorageCreating> boundFactory() {
  return KRBaseInjectorService::resolveImplementationClassForProtocol<KRDBDataStorageCreating>();
}

TEST(KRDBCoreInjectorServiceTest, LoadBindsTheDataStorageFactory) {
  KRDBCoreInjectorService::load();
  const auto factory = boundFactory();
  ASSERT_NE(factory, nullptr);
  EXPECT_NE(std::dynamic_pointer_cast<KRDBDataStorageFactoryBase>(factory), nullptr);
}

TEST(KRDBCoreInjectorServiceTest, BoundFactoryMakesMixedTypeTables) {
  KRDBCoreInjectorService::load();
  const auto factory = boundFactory();
  ASSERT_NE(factory, nullptr);
  const auto table = factory->makeMapTableWithObjectsMappedByEntityIDs();
  ASSERT_NE(table, nullptr);
  EXPECT_EQ(table->count(), 0u);
  const std::shared_ptr<KRObject> image = KRError::errorWithDomain("image", 0);
  const std::shared_ptr<KRObject> collection = KRError::errorWithDomain("collection", 0);
  table->setObject(image, KRDBEntityID::initWithEntityType(1, 42));
  table->setObject(collection, KRDBEntityID::initWithEntityType(2, 42));
  EXPECT_EQ(table->count(), 2u);
  EXPECT_EQ(table->objectForKey(KRDBEntityID::initWithEntityType(1, 42)), image);
  EXPECT_EQ(table->objectForKey(KRDBEntityID::initWithEntityType(2, 42)), collection);
}

TEST(KRDBCoreInjectorServiceTest, LoadingAgainKeepsTheBoundObject) {
  KRDBCoreInjectorService::load();
  const auto first = boundFactory();
  KRDBCoreInjectorService::load();
  EXPECT_EQ(boundFactory(), first);
  EXPECT_NE(first, nullptr);
}

}  // namespace
