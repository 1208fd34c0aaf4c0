// Changing relations through the context: memberships of collections and referenced folders, history
// states, folders and volumes. The graph in memory changes first; the catalog then does the same, and the
// sets it reports are compared with what changed in memory (a mismatch is only logged).
#include <algorithm>
#include <utility>
#include <vector>

#include "KRServices/KRLog.hpp"
#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesStorage.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"

namespace {

// A catalog callback that logs the warning when the catalog changed other entities than the memory did.
std::function<void(KRDBEntitySet)> comparingWith(KRDBEntitySet changed, const char* warning) {
  return [changed = std::move(changed), warning](const KRDBEntitySet& stored) {
    if (stored != changed) KRLog(KRLogLevelWarning, warning);
  };
}

// The children grouped by their parent before the move; children without one are not moved from anywhere.
using ParentGroups = std::vector<std::pair<std::shared_ptr<KRDBAbstractBaseFolder>, KRDBEntitySet>>;
ParentGroups groupByParent(const KRDBEntitySet& childs) {
  ParentGroups groups;
  for (const auto& entity : childs) {
    const auto parent = std::static_pointer_cast<KRDBAbstractBaseFolder>(entity)->parent();
    if (!parent) continue;
    auto group = std::find_if(groups.begin(), groups.end(), [&parent](const auto& entry) {
      return entry.first->entityID()->isEqualTo(parent->entityID());
    });
    if (group == groups.end()) group = groups.insert(groups.end(), {parent, {}});
    group->second.insert(entity);
  }
  return groups;
}

}  // namespace

// ---- Memberships

void KRDBContext::addChilds(const KRDBEntitySet& childs,
                            const std::shared_ptr<KRDBAbstractBaseFolder>& filter) {
  if (!filter) return;
  const KRDBEntitySet added = filter->addChildsPrimitive(childs);
  if (added.empty()) return;
  for (const auto& [previous, group] : groupByParent(added)) {
    registerUndo([previous, group](const auto& context) { context->addChilds(group, previous); });
    if (group.empty()) KRLog(KRLogLevelError, "Error: Inconsistency");
    if (previous->deleteChildsPrimitive(group) != group) KRLog(KRLogLevelWarning, "Warning: Inconsisency.");
  }
  for (const auto& child : added) std::static_pointer_cast<KRDBAbstractBaseFolder>(child)->setParent(filter);
  catalog_->addChilds(added, filter, comparingWith(added, "Warning: Inconsistency"), false);
}

void KRDBContext::addImages(const KRDBEntitySet& images,
                            const std::shared_ptr<KRDBAbstractBaseFolder>& filter) {
  if (!filter) return;
  registerUndo([images, filter](const auto& context) { context->deleteImages(images, filter); });
  const KRDBEntitySet added = filter->addImagesPrimitive(images);
  if (added.empty()) return;
  for (const auto& image : added) {
    if (std::static_pointer_cast<KRDBImage>(image)->addFiltersPrimitive({filter}) != KRDBEntitySet{filter})
      KRLog(KRLogLevelWarning, "Warning: Inconsistency");
  }
  catalog_->addImages(added, filter, comparingWith(added, "Warning: Insonsistency"), false);
}

void KRDBContext::addImages(const KRDBEntitySet& images,
                            const std::shared_ptr<KRDBReferencedFolder>& folder) {
  if (!folder) return;
  const KRDBEntitySet added = folder->addImagesPrimitive(images);
  if (!added.empty())
    catalog_->addImages(added, folder, comparingWith(added, "Warning: Insonsistency"), false);
}

void KRDBContext::deleteImages(const KRDBEntitySet& images,
                               const std::shared_ptr<KRDBAbstractBaseFolder>& filter) {
  if (!filter) return;
  registerUndo([images, filter](const auto& context) { context->addImages(images, filter); });
  const KRDBEntitySet removed = filter->deleteImagesPrimitive(images);
  if (removed.empty()) return;
  for (const auto& image : removed) {
    if (std::static_pointer_cast<KRDBImage>(image)->deleteFiltersPrimitive({filter}) != KRDBEntitySet{filter})
      KRLog(KRLogLevelWarning, "Warning: Inconsistency");
  }
  catalog_->deleteImages(removed, filter, comparingWith(removed, "Warning: Inconsistency"), false);
}

// ---- History states

void KRDBContext::setStates(const KRDBImageStates& states,
                            const std::shared_ptr<KRDBImageState>& currentState,
                            const std::shared_ptr<KRDBImage>& image) {
  if (!image) return;
  const auto oldStates = image->states();
  registerUndo([old = oldStates ? *oldStates : KRDBImageStates{}, oldCurrent = image->currentState(),
                image](const auto& context) { context->setStates(old, oldCurrent, image); });
  catalog_->setStates(states, currentState, image);
  image->setCurrentStatePrimitive(currentState);
  image->setStatesPrimitive(std::make_shared<const KRDBImageStates>(states));
}

void KRDBContext::setStatesArray(const std::vector<KRDBImageStates>& statesArray,
                                 const KRDBImageStates& currentStatesArray,
                                 const KRDBEntityArray& imagesArray) {
  std::vector<KRDBImageStates> oldStates;
  KRDBImageStates oldCurrents;
  for (const auto& entity : imagesArray) {
    const auto image = std::static_pointer_cast<KRDBImage>(entity);
    const auto states = image->states();
    oldStates.push_back(states ? *states : KRDBImageStates{});
    oldCurrents.push_back(image->currentState());
  }
  registerUndo([oldStates, oldCurrents, imagesArray](const auto& context) {
    context->setStatesArray(oldStates, oldCurrents, imagesArray);
  });
  catalog_->setStatesArray(statesArray, currentStatesArray, imagesArray);
  const size_t count = std::min({statesArray.size(), currentStatesArray.size(), imagesArray.size()});
  for (size_t index = 0; index < count; ++index) {
    const auto image = std::static_pointer_cast<KRDBImage>(imagesArray[index]);
    image->setCurrentStatePrimitive(currentStatesArray[index]);
    image->setStatesPrimitive(std::make_shared<const KRDBImageStates>(statesArray[index]));
  }
}

void KRDBContext::setCurrentState(const std::shared_ptr<KRDBImageState>& state,
                                  const std::shared_ptr<KRDBImage>& image) {
  if (!image) return;
  registerUndo(
      [old = image->currentState(), image](const auto& context) { context->setCurrentState(old, image); });
  image->setCurrentStatePrimitive(state);
  catalog_->setCurrentState(state, image);
}

// ---- Folders and volumes

void KRDBContext::setVolume(const std::shared_ptr<KRDBVolume>& volume,
                            const std::shared_ptr<KRDBPath>& path) {
  if (!path) return;
  registerUndo([old = path->volume(), path](const auto& context) { context->setVolume(old, path); });
  catalog_->setVolume(volume, path);
  path->setVolume(volume);
}

void KRDBContext::setFolderDBPath(const std::shared_ptr<KRDBPath>& path, const KRDBEntityArray& images) {
  KRDBEntityArray rebound;
  KRDBEntityArray bound;
  for (const auto& entity : images) {
    const auto image = std::static_pointer_cast<KRDBImage>(entity);
    if (!image || image->folderDBPath() == path) continue;
    image->setFolderDBPathPrimitive(path, true);
    (image->folderDBPath() ? rebound : bound).push_back(image);
  }
  catalog_->rebindFolderDBPath(path, rebound);
  catalog_->bindFolderDBPath(path, bound);
}

void KRDBContext::setNewPath(const KRString& newPath, const std::shared_ptr<KRDBVolume>& newVolume,
                             const std::shared_ptr<KRDBPath>& path, std::function<void(bool)> completion) {
  if (!path) return;
  const KRString oldPath = path->path();
  const auto oldVolume = path->volume();
  std::weak_ptr<KRDBContext> weak = weakSelf();
  catalog_->renamePath(
      oldPath, oldVolume, newPath, newVolume,
      [weak, oldPath, oldVolume, newPath, newVolume, completion = std::move(completion)](bool done) {
        const auto context = weak.lock();
        if (done && context) context->renameCachedPaths(oldPath, oldVolume, newPath, newVolume);
        if (completion) completion(done);
      });
}

void KRDBContext::renameCachedPaths(const KRString& oldPath, const std::shared_ptr<KRDBVolume>& oldVolume,
                                    const KRString& newPath, const std::shared_ptr<KRDBVolume>& newVolume) {
  const KRString oldPrefix = normilizedPath(oldPath);
  const KRString newPrefix = normilizedPath(newPath);
  for (const auto& entity : fetchedEntities_->allEntitiesWithType(KRDBEntityTypePath)) {
    const auto cached = std::static_pointer_cast<KRDBPath>(entity);
    if (cached->volumePrimitive() != oldVolume) continue;
    const KRString current = cached->path();
    if (current == oldPath) {
      cached->setPath(newPath, true);
      cached->setVolume(newVolume);
    } else if (current.hasPrefix(oldPrefix)) {
      // Every occurrence of the old path is replaced, not only the leading one: kept so on purpose.
      cached->setPath(current.stringByReplacingOccurrencesOfString(oldPrefix, newPrefix), true);
      cached->setVolumePrimitive(newVolume);
    }
  }
}
