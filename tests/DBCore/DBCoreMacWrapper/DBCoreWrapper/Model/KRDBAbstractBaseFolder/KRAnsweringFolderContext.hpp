#pragma once

#include <memory>
#include <vector>

#include "KRRecordingEntityContext.hpp"
#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"

// A recording context that answers the folder relations it was given and keeps the arguments of the
// membership changes folders ask for.
class KRAnsweringFolderContext : public KRRecordingEntityContext {
 public:
  std::shared_ptr<KRDBAbstractBaseFolder> parent;
  KRDBEntitySet childs;
  KRDBEntitySet images;
  // The entities and the folder of every membership change, in order.
  std::vector<KRDBEntitySet> changedEntities;
  std::vector<std::shared_ptr<KRDBEntity>> changedFolders;

  std::shared_ptr<KRDBAbstractBaseFolder> parentOfFilter(
      const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    KRRecordingEntityContext::parentOfFilter(filter);
    return parent;
  }
  KRDBEntitySet childsOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    KRRecordingEntityContext::childsOfFilter(filter);
    return childs;
  }
  KRDBEntitySet imagesOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    KRRecordingEntityContext::imagesOfFilter(filter);
    return images;
  }
  void addChilds(const KRDBEntitySet& entities,
                 const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    KRRecordingEntityContext::addChilds(entities, filter);
    keep(entities, filter);
  }
  void addImages(const KRDBEntitySet& entities,
                 const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    KRRecordingEntityContext::addImages(entities, filter);
    keep(entities, filter);
  }
  void addImages(const KRDBEntitySet& entities,
                 const std::shared_ptr<KRDBReferencedFolder>& folder) override {
    KRRecordingEntityContext::addImages(entities, folder);
    keep(entities, folder);
  }
  void deleteImages(const KRDBEntitySet& entities,
                    const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    KRRecordingEntityContext::deleteImages(entities, filter);
    keep(entities, filter);
  }

 private:
  void keep(const KRDBEntitySet& entities, const std::shared_ptr<KRDBEntity>& folder) {
    changedEntities.push_back(entities);
    changedFolders.push_back(folder);
  }
};
