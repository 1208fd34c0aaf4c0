#include "Model/KRDBContext/KRDBAdditionalFetchForImagesService.hpp"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "KRContextCatalog.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"

namespace {

using ImagePtr = std::shared_ptr<KRDBImage>;
using Service = KRDBAdditionalFetchForImagesService;

class KRDBAdditionalFetchForImagesServiceTest : public testing::Test {
 protected:
  void SetUp() override { folders = {store.folder("/photos/a"), store.folder("/photos/b")}; }

  void open() {
    context = KRDBContext::initWithCatalog(store.catalog());
    service = Service::initWithContext(context);
  }
  // A bare copy of the image's record, as the catalog builds it, with no link attached.
  ImagePtr bare(const ImagePtr& image) {
    return std::static_pointer_cast<KRDBImage>(store.catalog()->fetchEntityWithID(image->entityID()));
  }
  static void expectAllLinks(const ImagePtr& image) {
    EXPECT_TRUE(image->folderDBPathPrimitive());
    EXPECT_TRUE(image->attributesPrimitive());
    EXPECT_TRUE(image->exivAttributesPrimitive());
    EXPECT_TRUE(image->currentStatePrimitive());
  }

  KRContextCatalog store;
  std::vector<std::shared_ptr<KRDBPath>> folders;
  std::shared_ptr<KRDBContext> context;
  std::shared_ptr<Service> service;
};

TEST_F(KRDBAdditionalFetchForImagesServiceTest, StartsWithNoMapsAndNoFetch) {
  open();
  EXPECT_FALSE(service->isFetchingMaps());
  EXPECT_FALSE(service->allFetchesCompleted());
  EXPECT_FALSE(service->imagesPathesMap());
  EXPECT_FALSE(service->imagesImageAttributesMap());
  EXPECT_FALSE(service->imagesImageExivAttributesMap());
  EXPECT_FALSE(service->imagesCurrentStatesMap());
}

TEST_F(KRDBAdditionalFetchForImagesServiceTest, ImagesAskedBeforeTheMapsAreServedOnceInOrder) {
  const auto images = store.images(4, folders);
  open();
  std::vector<int> calls;
  std::vector<ImagePtr> asked;
  for (int index = 0; index < 4; ++index) {
    asked.push_back(bare(images[static_cast<size_t>(index)]));
    service->fastAdditionalFetchesForImage(asked.back(), [&calls, index] { calls.push_back(index); });
    EXPECT_TRUE(service->isFetchingMaps());
  }
  EXPECT_TRUE(calls.empty());
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return calls.size() == 4; }));
  EXPECT_EQ(calls, (std::vector<int>{0, 1, 2, 3}));
  EXPECT_FALSE(service->isFetchingMaps());
  EXPECT_TRUE(service->allFetchesCompleted());
  EXPECT_EQ(service->imagesImageAttributesMap()->size(), 4u);
  EXPECT_EQ(service->imagesPathesMap()->size(), 4u);
  for (const auto& image : asked) {
    expectAllLinks(image);
    EXPECT_EQ(image->attributesPrimitive()->imagePrimitive(), image);
    EXPECT_EQ(image->exivAttributesPrimitive()->imagePrimitive(), image);
  }
  store.waitForQueue();
  EXPECT_EQ(calls.size(), 4u);
}

TEST_F(KRDBAdditionalFetchForImagesServiceTest, AskingForTheMapsWhileTheyAreFetchedStartsNothingMore) {
  const int64_t imageID = store.images(1, folders)[0]->entityID()->dbid();
  open();
  service->requestFetchingMaps();
  EXPECT_TRUE(service->isFetchingMaps());
  service->requestFetchingMaps();
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return service->allFetchesCompleted(); }));
  EXPECT_FALSE(service->isFetchingMaps());
  const auto* attributes = &*service->imagesImageAttributesMap();
  const auto firstAttributes = *service->imagesImageAttributesMap()->find(imageID);
  ASSERT_NE(firstAttributes, nullptr);
  store.waitForQueue();
  EXPECT_EQ(&*service->imagesImageAttributesMap(), attributes);
  EXPECT_EQ(*service->imagesImageAttributesMap()->find(imageID), firstAttributes);
}

TEST_F(KRDBAdditionalFetchForImagesServiceTest, AnImageAskedAfterTheMapsIsServedAtOnce) {
  const auto images = store.images(2, folders);
  open();
  service->requestFetchingMaps();
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return service->allFetchesCompleted(); }));
  const auto image = bare(images[1]);
  bool called = false;
  service->fastAdditionalFetchesForImage(image, [&] { called = true; });
  EXPECT_TRUE(called);
  expectAllLinks(image);
  ASSERT_TRUE(image->folderDBPathPrimitive());
  EXPECT_EQ(image->folderDBPathPrimitive(),
            context->cachedEntityForEntityID(image->folderDBPathPrimitive()->entityID()));
}

TEST_F(KRDBAdditionalFetchForImagesServiceTest, ABatchWaitsAsOneCallbackInTheQueueOfSingleImages) {
  const auto images = store.images(3, folders);
  open();
  std::vector<std::string> calls;
  const auto single = bare(images[0]);
  const auto batch = std::make_shared<std::vector<ImagePtr>>(std::vector{bare(images[1]), bare(images[2])});
  service->fastAdditionalFetchesForImages(batch, [&] {
    calls.push_back("batch");
    for (const auto& image : *batch) expectAllLinks(image);
  });
  service->fastAdditionalFetchesForImage(single, [&] { calls.push_back("single"); });
  EXPECT_TRUE(service->isFetchingMaps());
  EXPECT_TRUE(calls.empty());
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return calls.size() == 2; }));
  EXPECT_EQ(calls, (std::vector<std::string>{"batch", "single"}));
  expectAllLinks(single);
  // Both images of the batch share the cached instance of their folder path where they share the folder.
  EXPECT_EQ((*batch)[0]->folderDBPathPrimitive(),
            context->cachedEntityForEntityID((*batch)[0]->folderDBPathPrimitive()->entityID()));
}

TEST_F(KRDBAdditionalFetchForImagesServiceTest, ABatchAfterTheMapsIsServedAtOnceAndNeedsAHandler) {
  const auto images = store.images(2, folders);
  open();
  service->fastAdditionalFetchesForImages(std::make_shared<std::vector<ImagePtr>>(), nullptr);
  EXPECT_FALSE(service->isFetchingMaps());
  service->requestFetchingMaps();
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return service->allFetchesCompleted(); }));
  const auto batch = std::make_shared<std::vector<ImagePtr>>(std::vector{bare(images[0]), bare(images[1])});
  bool called = false;
  service->fastAdditionalFetchesForImages(batch, [&] { called = true; });
  EXPECT_TRUE(called);
  for (const auto& image : *batch) expectAllLinks(image);
}

TEST_F(KRDBAdditionalFetchForImagesServiceTest, WithoutAHandlerNothingHappens) {
  store.images(1, folders);
  open();
  service->fastAdditionalFetchesForImage(bare(store.images(1, folders)[0]), nullptr);
  EXPECT_FALSE(service->isFetchingMaps());
}

TEST_F(KRDBAdditionalFetchForImagesServiceTest, ACatalogWithoutImagesGivesFourEmptyMaps) {
  open();
  service->requestFetchingMaps();
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return service->allFetchesCompleted(); }));
  EXPECT_TRUE(service->imagesPathesMap()->empty());
  EXPECT_TRUE(service->imagesImageAttributesMap()->empty());
  EXPECT_TRUE(service->imagesImageExivAttributesMap()->empty());
  EXPECT_TRUE(service->imagesCurrentStatesMap()->empty());
}

TEST_F(KRDBAdditionalFetchForImagesServiceTest, AnImageTheMapsLackFallsBackToTheOrdinaryFetch) {
  open();
  service->requestFetchingMaps();
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return service->allFetchesCompleted(); }));
  const auto created = store.images(1, folders).at(0);
  const auto image = bare(created);
  service->fastAdditionalFetchesForImage(image, [] {});
  EXPECT_FALSE(image->attributesPrimitive());
  EXPECT_TRUE(image->needFetchNecessaryEntities());
  // The ordinary fetch attaches the necessary links; the current state is read when asked for.
  const auto prepared = std::static_pointer_cast<KRDBImage>(context->entityWithID(created->entityID()));
  EXPECT_TRUE(prepared->folderDBPath());
  EXPECT_TRUE(prepared->attributesPrimitive());
  EXPECT_TRUE(prepared->exivAttributesPrimitive());
  EXPECT_FALSE(prepared->needFetchNecessaryEntities());
}

}  // namespace
