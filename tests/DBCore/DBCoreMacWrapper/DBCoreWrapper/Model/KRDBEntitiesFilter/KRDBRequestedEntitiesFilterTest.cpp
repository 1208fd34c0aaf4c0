#include "Model/KRDBEntitiesFilter/KRDBRequestedEntitiesFilter.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRContextCatalog.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"
#include "Model/KRDBFilteredPathsFetchRequest/KRDBFilteredPathsFetchRequest.hpp"
#include "dbconstants.hpp"

namespace {

using EntitySetPtr = KRDBEntitiesFilter::EntitySetPtr;

class KRDBRequestedEntitiesFilterTest : public testing::Test {
 protected:
  void SetUp() override {
    folders = {store.folder("/photos/a"), store.folder("/photos/b")};
    images = store.images(4, folders);
    context = KRDBContext::initWithCatalog(store.catalog());
  }

  // The filter's entities once obtained.
  static EntitySetPtr obtained(const std::shared_ptr<KRDBEntitiesFilter>& filter) {
    EntitySetPtr result;
    bool done = false;
    filter->obtainEntities([&](const EntitySetPtr& entities) {
      result = entities;
      done = true;
    });
    EXPECT_TRUE(KRContextCatalog::runUntil([&] { return done; }));
    return result;
  }

  KRContextCatalog store;
  std::vector<std::shared_ptr<KRDBPath>> folders;
  std::vector<std::shared_ptr<KRDBImage>> images;
  std::shared_ptr<KRDBContext> context;
};

TEST_F(KRDBRequestedEntitiesFilterTest, HoldsTheTypeOfItsRequest) {
  const auto filter =
      KRDBRequestedEntitiesFilter::initWithContext(context, KRDBFilteredPathsFetchRequest::init());
  EXPECT_EQ(filter->entityTypes(), (KRDBSpecifiedTypesEntitiesFilter::EntityTypes{KRDBEntityTypePath}));
}

TEST_F(KRDBRequestedEntitiesFilterTest, ObtainsTheRequestsEntitiesAsCachedPreparedInstances) {
  const auto filter =
      KRDBRequestedEntitiesFilter::initWithContext(context, KRDBFilteredImagesFetchRequest::init());
  const EntitySetPtr entities = obtained(filter);
  ASSERT_TRUE(entities);
  ASSERT_EQ(entities->size(), images.size());
  for (const auto& entity : *entities) {
    EXPECT_EQ(context->cachedEntityForEntityID(entity->entityID()), entity);
    EXPECT_EQ(entity->necesserryEntitiesToFetchCount(), 0u);
  }
}

TEST_F(KRDBRequestedEntitiesFilterTest, MembershipIsTheRequestsInMemoryTest) {
  const auto request = KRDBFilteredImagesFetchRequest::init();
  request->setFilterConditions({{KRImagesConditionType, "file_size_int_64 == 1002"}});
  const auto filter = KRDBRequestedEntitiesFilter::initWithContext(context, request);
  const EntitySetPtr entities = obtained(filter);
  ASSERT_TRUE(entities);
  ASSERT_EQ(entities->size(), 1u);
  for (const auto& image : images) {
    const auto cached = context->entityWithID(image->entityID());
    EXPECT_EQ(filter->isEntitySatisfiesFilterConditions(cached), entities->contains(cached));
  }
}

TEST_F(KRDBRequestedEntitiesFilterTest, ResetDropsTheRequestsPredicatesAndTheLists) {
  const auto request = KRDBFilteredImagesFetchRequest::init();
  const auto filter = KRDBRequestedEntitiesFilter::initWithContext(context, request);
  ASSERT_TRUE(obtained(filter));
  const auto predicate = KRPredicate::predicateWithValue(false);
  request->setWherePredicate(predicate);
  filter->reset();
  EXPECT_FALSE(filter->entities());
  EXPECT_NE(request->wherePredicate(), predicate);
}

TEST_F(KRDBRequestedEntitiesFilterTest, AContextGoneObtainsNothing) {
  const auto filter =
      KRDBRequestedEntitiesFilter::initWithContext(context, KRDBFilteredImagesFetchRequest::init());
  context.reset();
  bool called = false;
  filter->obtainEntities([&](const EntitySetPtr&) { called = true; });
  store.waitForQueue();
  EXPECT_FALSE(called);
  EXPECT_FALSE(filter->context());
}

}  // namespace
