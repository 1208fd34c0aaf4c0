#include "Model/KRDBEntitiesFilter/KRDBImagesFilter.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRContextCatalog.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesChangesStorage.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"

namespace {

class KRDBImagesFilterTest : public testing::Test {
 protected:
  void SetUp() override {
    images = store.images(2, {store.folder("/photos")});
    context = KRDBContext::initWithCatalog(store.catalog());
    first = std::static_pointer_cast<KRDBImage>(context->entityWithID(images[0]->entityID()));
    second = std::static_pointer_cast<KRDBImage>(context->entityWithID(images[1]->entityID()));
    filter = KRDBImagesFilter::initWithContext(context, KRDBFilteredImagesFetchRequest::init());
  }
  static std::shared_ptr<KRDBEntitySet> setOf(KRDBEntitySet entities) {
    return std::make_shared<KRDBEntitySet>(std::move(entities));
  }

  KRContextCatalog store;
  std::vector<std::shared_ptr<KRDBImage>> images;
  std::shared_ptr<KRDBContext> context;
  std::shared_ptr<KRDBImage> first, second;
  std::shared_ptr<KRDBImagesFilter> filter;
};

TEST_F(KRDBImagesFilterTest, HoldsImages) {
  EXPECT_EQ(filter->entityTypes(), (KRDBSpecifiedTypesEntitiesFilter::EntityTypes{KRDBEntityTypeImage}));
  EXPECT_EQ(context->allImagesFilter()->className(), filter->className());
}

TEST_F(KRDBImagesFilterTest, UpdatingOnlyAnImagesExifAttributesReportsTheImageAsUpdated) {
  filter->processChanges(KRDBEntitiesChangesStorage::initWithAddedEntities(
      nullptr, nullptr, setOf({second->exivAttributesPrimitive()}), nullptr));
  ASSERT_TRUE(filter->updatedEntities());
  EXPECT_EQ(*filter->updatedEntities(), (KRDBEntitySet{second}));
}

TEST_F(KRDBImagesFilterTest, TheAttributesChangeRecordsGoUnderTheImage) {
  auto records = KRDBContext::emptyEntitiesChangesMapTable();
  const auto record = KRDBEntityID::initWithEntityType(0, 0);
  records->setObject(record, first->attributesPrimitive()->entityID());
  filter->processChanges(KRDBEntitiesChangesStorage::initWithAddedEntities(
      nullptr, nullptr, setOf({first->attributesPrimitive(), second}), records));
  ASSERT_TRUE(filter->updatedEntities());
  EXPECT_EQ(*filter->updatedEntities(), (KRDBEntitySet{first, second}));
}

TEST_F(KRDBImagesFilterTest, ChangesWithoutUpdatesPassUnchanged) {
  filter->processChanges(
      KRDBEntitiesChangesStorage::initWithAddedEntities(setOf({first}), nullptr, nullptr, nullptr));
  ASSERT_TRUE(filter->addedEntities());
  EXPECT_EQ(*filter->addedEntities(), (KRDBEntitySet{first}));
  EXPECT_FALSE(filter->updatedEntities());
}

}  // namespace
