#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "KRContextCatalog.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"

// A context over a catalog with two collections under the root (the first holding two images and a child
// collection), three images in two folders and a referenced folder, all as the context's cached instances,
// for the tests of the relations and of the operations that change them.
class KRContextGraphFixture : public testing::Test {
 protected:
  using ImagePtr = std::shared_ptr<KRDBImage>;
  using CollectionPtr = std::shared_ptr<KRDBCollection>;

  void SetUp() override {
    folders = {store.folder("/photos/a"), store.folder("/photos/b")};
    const auto written = store.images(3, folders);
    const auto top = store.create<KRDBCollection>(KRDBEntityTypeCollection);
    const auto other = store.create<KRDBCollection>(KRDBEntityTypeCollection);
    const auto below = store.create<KRDBCollection>(KRDBEntityTypeCollection);
    const auto referenced = store.create<KRDBReferencedFolder>(KRDBEntityTypeReferencedFolder,
                                                               {{"DBReferencedFolderPath", folders[0]}});
    store.onQueue([&](KRDBCatalog& queue) {
      const auto root =
          queue.fetchEntityWithIDSync(KRDBEntityID::initWithEntityType(KRDBEntityTypeCollection, 1));
      queue.addChildsSync({top, other}, root);
      queue.addChildsSync({below}, top);
      queue.addImagesSync({written[0], written[1]}, top);
    });
    context = KRDBContext::initWithCatalog(store.catalog());
    for (const auto& image : written) images.push_back(cached(image));
    first = cached(top);
    second = cached(other);
    child = cached(below);
    folder = cached(referenced);
  }

  // Reads the children and members that the operations change in memory.
  void loadRelations() {
    context->rootFilter()->childs();
    first->childs();
    first->images();
    for (const auto& image : images) image->filters();
  }

  template <class T>
  std::shared_ptr<T> cached(const std::shared_ptr<T>& fetched) {
    return std::static_pointer_cast<T>(context->entityWithID(fetched->entityID()));
  }
  // Turns the main run loop until the scheduled pass, if any, has run and the catalog's queue is idle.
  void finishTurn() {
    ASSERT_TRUE(KRContextCatalog::runUntil([&] { return !context->isWaitingForProcessChanges(); }));
    store.waitForQueue();
  }
  // The ids of the images the catalog holds for a collection.
  std::vector<int64_t> storedImageIDs(const std::shared_ptr<KRDBEntity>& collection) {
    std::vector<int64_t> ids;
    for (const auto& image : store.catalog()->fetchImagesOfFilter(collection))
      ids.push_back(image->entityID()->dbid());
    return ids;
  }

  KRContextCatalog store;
  std::vector<std::shared_ptr<KRDBPath>> folders;
  std::shared_ptr<KRDBContext> context;
  std::vector<ImagePtr> images;
  CollectionPtr first, second, child;
  std::shared_ptr<KRDBReferencedFolder> folder;
};
