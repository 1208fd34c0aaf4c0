#include "Model/KRDBEntitiesFilter/KRDBBaseFolderFilter.hpp"

#include <utility>

#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"

std::shared_ptr<KRDBBaseFolderFilter> KRDBBaseFolderFilter::initWithFolders(const KRDBEntitySet& folders) {
  std::shared_ptr<KRDBBaseFolderFilter> filter(new KRDBBaseFolderFilter());
  filter->folders_ = folders;
  std::shared_ptr<KRDBContext> context;
  if (!folders.empty() && *folders.begin())
    context = std::dynamic_pointer_cast<KRDBContext>((*folders.begin())->context());
  filter->setUpWithContext(context);
  return filter;
}

std::shared_ptr<KRDBBaseFolderFilter> KRDBBaseFolderFilter::initWithFolder(const FolderPtr& folder) {
  return initWithFolders(folder ? KRDBEntitySet{folder} : KRDBEntitySet{});
}

KRDBSpecifiedTypesEntitiesFilter::EntityTypes KRDBBaseFolderFilter::filteredEntitiesTypes() const {
  EntityTypes types;
  for (const auto& folder : folders_) {
    if (folder) types.insert(folder->entityID()->entityType());
  }
  return types;
}

bool KRDBBaseFolderFilter::isEntitySatisfiesFilterConditions(const EntityPtr& entity) const {
  const auto child = std::dynamic_pointer_cast<KRDBAbstractBaseFolder>(entity);
  if (!child || child->isMarkedToDelete()) return false;
  const auto parent = child->parentPrimitive();
  return parent && folders_.contains(parent);
}

void KRDBBaseFolderFilter::initiallyObtainFilteredEntities(EntitiesHandler completion) {
  if (folders_.empty()) return completion(std::make_shared<KRDBEntitySet>());
  struct Answers {
    EntitySetPtr children = std::make_shared<KRDBEntitySet>();
    size_t pending = 0;
  };
  const auto answers = std::make_shared<Answers>();
  answers->pending = folders_.size();
  for (const auto& folder : folders_) {
    obtainEntitiesForFolder(std::static_pointer_cast<KRDBAbstractBaseFolder>(folder),
                            [answers, completion](const EntitySetPtr& children) {
                              if (children) {
                                for (const auto& child : *children) {
                                  if (!child->isMarkedToDelete()) answers->children->insert(child);
                                }
                              }
                              if (--answers->pending == 0) completion(answers->children);
                            });
  }
}

void KRDBBaseFolderFilter::obtainEntitiesForFolder(const FolderPtr& folder, EntitiesHandler handler) {
  const auto owner = context();
  if (!owner || !folder) return handler(std::make_shared<KRDBEntitySet>());
  owner->obtainChildsOfFilter(folder, [handler = std::move(handler)](KRDBEntitySet children) {
    handler(std::make_shared<KRDBEntitySet>(std::move(children)));
  });
}

bool KRDBBaseFolderFilter::invalidCurrentFoldersForChanges(const ChangesStoragePtr& changes) const {
  const auto& deleted = changes ? changes->deletedEntities() : nullptr;
  if (!deleted) return false;
  for (const auto& folder : folders_) {
    if (deleted->contains(folder)) return true;
  }
  return false;
}

void KRDBBaseFolderFilter::processChanges(const ChangesStoragePtr& changes) {
  if (invalidCurrentFoldersForChanges(changes)) return invalidate();
  KRDBSpecifiedTypesEntitiesFilter::processChanges(changes);
}
