#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "KRFoundation/KRDate.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "KRTestExifReader.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntity/KRDBEntityClasses.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "support/KRTemporaryDirectory.hpp"

// A fresh catalog file for context tests, filled through the catalog itself: a volume, folder paths on it,
// images in those folders (with their user and exif attribute records) and a current history state per
// image. The records are written before any context exists, so a context built afterwards meets none of
// them in its cache.
class KRContextCatalog {
 public:
  KRContextCatalog() {
    KRDBEntityClasses::registerAll();
    catalog_ = KRDBCatalog::initWithContentsOfFile(directory_.file("catalog.krcatalog"), nullptr);
    catalog_->initializeAndUpdateIfNeaded();
  }
  ~KRContextCatalog() { catalog_->forceCloseDB(); }

  const std::shared_ptr<KRDBCatalog>& catalog() const { return catalog_; }
  std::string file(const std::string& name) const { return directory_.file(name); }

  // Runs work on the catalog's queue and waits for it.
  void onQueue(const std::function<void(KRDBCatalog&)>& work) {
    catalog_->performSynchronously(true, [&] { work(*catalog_); });
  }
  template <class T>
  std::shared_ptr<T> create(int64_t type, const KRDictionary& info = {}) {
    std::shared_ptr<T> created;
    onQueue([&](KRDBCatalog& queue) {
      created = std::dynamic_pointer_cast<T>(queue.createEntityWithTypeSync(type, info));
    });
    return created;
  }
  std::shared_ptr<KRDBPath> folder(const std::string& text) {
    if (!volume_) volume_ = create<KRDBVolume>(KRDBEntityTypeVolume);
    KRDBEntityArray paths;
    onQueue([&](KRDBCatalog& queue) {
      paths =
          queue.createDBPathsWithEntitiesInfo({{{"DBPathInfoPath", text}, {"DBPathInfoVolume", volume_}}});
    });
    return std::static_pointer_cast<KRDBPath>(paths.at(0));
  }
  // `count` images spread over the folders, each with a current state; returns them in creation order.
  // `takenAt` gives the capture date (seconds since 1970) of the image at an index; without it every
  // image has the reader's fixed one.
  std::vector<std::shared_ptr<KRDBImage>> images(int count,
                                                 const std::vector<std::shared_ptr<KRDBPath>>& folders,
                                                 const std::function<double(int)>& takenAt = nullptr) {
    std::vector<std::shared_ptr<KRDBImage>> made;
    for (int index = 0; index < count; ++index) {
      const std::string name = "IMG_" + std::to_string(index) + ".JPG";
      const KRDictionary info{
          {"DBImageInfoExifReader", exifReader(name, index, takenAt)},
          {"DBImageInfoImageName", name},
          {"DBImageInfoFolderDBPath", folders[static_cast<size_t>(index) % folders.size()]}};
      KRDBEntityArray created;
      onQueue([&](KRDBCatalog& queue) { created = queue.createDBImagesWithEntitiesInfo({info}); });
      const auto image = std::static_pointer_cast<KRDBImage>(created.at(0));
      const auto state = create<KRDBImageState>(KRDBEntityTypeImageState, {{"guid", "state-" + name}});
      catalog_->setStates({state}, state, image);
      made.push_back(image);
    }
    waitForQueue();
    return made;
  }
  // The reader of the image of that name and index: camera values, a size from the index.
  static std::shared_ptr<KRTestExifReader> exifReader(const std::string& name, int index,
                                                      const std::function<double(int)>& takenAt = nullptr) {
    std::optional<KRDate> taken;
    if (takenAt) taken = KRDate::dateWithTimeIntervalSince1970(takenAt(index));
    return KRTestExifReader::make(
        {"/p/" + name, 600, 400, 1000 + index, KRDate::dateWithTimeIntervalSince1970(1600000000),
         KRDate::dateWithTimeIntervalSince1970(1500000000)},
        true, std::move(taken));
  }
  // Waits on the main run loop until the catalog ran every operation queued so far.
  void waitForQueue() {
    bool done = false;
    catalog_->waitForAllDataBaseOperationsWithHandler([&done] { done = true; });
    ASSERT_TRUE(runUntil([&done] { return done; }));
  }

  // Turns the main run loop until the condition holds; false after a generous bound.
  static bool runUntil(const std::function<bool()>& condition) {
    return KRRunLoop::mainRunLoop()->runUntil(condition, KRDate::dateWithTimeIntervalSinceNow(20));
  }

 private:
  KRTemporaryDirectory directory_;
  std::shared_ptr<KRDBCatalog> catalog_;
  std::shared_ptr<KRDBVolume> volume_;
};
