#include "Model/KRDBEntitiesFilter/KRDBSpecifiedTypesEntitiesFilter.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRContextCatalog.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesChangesStorage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"

namespace {

using EntitySetPtr = KRDBEntitiesFilter::EntitySetPtr;

// A filter of images and paths; with `named` false it names no types and so reaches the base's.
class KRTestTypesFilter : public KRDBSpecifiedTypesEntitiesFilter {
 public:
  static std::shared_ptr<KRTestTypesFilter> make(const std::shared_ptr<KRDBContext>& context, bool named) {
    std::shared_ptr<KRTestTypesFilter> filter(new KRTestTypesFilter(named));
    filter->setUpWithContext(context);
    return filter;
  }
  EntityTypes filteredEntitiesTypes() const override {
    if (!named_) return KRDBSpecifiedTypesEntitiesFilter::filteredEntitiesTypes();
    return {KRDBEntityTypeImage, KRDBEntityTypePath};
  }

 private:
  explicit KRTestTypesFilter(bool named) : named_(named) {}
  bool named_;
};

class KRDBSpecifiedTypesEntitiesFilterTest : public testing::Test {
 protected:
  void SetUp() override {
    path = store.folder("/photos");
    images = store.images(2, {path});
    context = KRDBContext::initWithCatalog(store.catalog());
    image = std::static_pointer_cast<KRDBImage>(context->entityWithID(images[0]->entityID()));
    attributes = image->attributesPrimitive();
  }

  KRContextCatalog store;
  std::shared_ptr<KRDBPath> path;
  std::vector<std::shared_ptr<KRDBImage>> images;
  std::shared_ptr<KRDBContext> context;
  std::shared_ptr<KRDBImage> image;
  std::shared_ptr<KRDBImageAttributes> attributes;
};

TEST_F(KRDBSpecifiedTypesEntitiesFilterTest, TakesItsTypesAndObservesTheContext) {
  const auto filter = KRTestTypesFilter::make(context, true);
  EXPECT_EQ(filter->entityTypes(), (KRDBSpecifiedTypesEntitiesFilter::EntityTypes{1, 4}));
  EXPECT_EQ(filter->context(), context);
  EXPECT_TRUE(context->hasListener(filter));
}

TEST_F(KRDBSpecifiedTypesEntitiesFilterTest, KeepsOfAChangeSetTheEntitiesOfItsTypes) {
  const auto filter = KRTestTypesFilter::make(context, true);
  filter->contextDidUpdate(context,
                           KRDBEntitiesChangesStorage::initWithAddedEntities(
                               std::make_shared<KRDBEntitySet>(KRDBEntitySet{image->folderDBPath()}), nullptr,
                               std::make_shared<KRDBEntitySet>(KRDBEntitySet{image, attributes}), nullptr));
  ASSERT_TRUE(filter->addedEntities());
  EXPECT_EQ(*filter->addedEntities(), (KRDBEntitySet{image->folderDBPath()}));
  ASSERT_TRUE(filter->updatedEntities());
  EXPECT_EQ(*filter->updatedEntities(), (KRDBEntitySet{image}));
  EXPECT_FALSE(filter->deletedEntities());
}

TEST_F(KRDBSpecifiedTypesEntitiesFilterTest, AnInvalidFilterIgnoresChanges) {
  const auto filter = KRTestTypesFilter::make(context, true);
  filter->invalidate();
  filter->processChanges(KRDBEntitiesChangesStorage::initWithAddedEntities(
      std::make_shared<KRDBEntitySet>(KRDBEntitySet{image}), nullptr, nullptr, nullptr));
  EXPECT_FALSE(filter->addedEntities());
}

TEST_F(KRDBSpecifiedTypesEntitiesFilterTest, WithoutItsTypesTheFilterLogsAndRaises) {
  KRCapturingLogSink sink;
  EXPECT_THROW(KRTestTypesFilter::make(context, false), KRException);
  ASSERT_EQ(sink.messages().size(), 1u);
  EXPECT_EQ(sink.messages()[0], "Error: filteredEntitiesTypes should be overrided in subclass");
}

}  // namespace
