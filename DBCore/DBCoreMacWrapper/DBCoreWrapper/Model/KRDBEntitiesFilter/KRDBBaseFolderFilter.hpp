#pragma once

#include <memory>

#include "Model/KRDBEntitiesFilter/KRDBSpecifiedTypesEntitiesFilter.hpp"

class KRDBAbstractBaseFolder;

// The live children of some folders (collections, referenced folders, smart filters): the child folders
// not marked to delete whose parent is one of them. Deleting one of the folders freezes the filter with
// its last contents. Used on the context's thread.
class KRDBBaseFolderFilter : public KRDBSpecifiedTypesEntitiesFilter {
 public:
  using FolderPtr = std::shared_ptr<KRDBAbstractBaseFolder>;

  // The context is that of the folders (any one of them).
  static std::shared_ptr<KRDBBaseFolderFilter> initWithFolders(const KRDBEntitySet& folders);
  static std::shared_ptr<KRDBBaseFolderFilter> initWithFolder(const FolderPtr& folder);

  const KRDBEntitySet& folders() const { return folders_; }
  // The entity types of the folders.
  EntityTypes filteredEntitiesTypes() const override;
  bool isEntitySatisfiesFilterConditions(const EntityPtr& entity) const override;
  // The children of every folder, not marked to delete, once every folder has answered.
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override;
  // Invalidates the filter when one of its folders is deleted; otherwise takes the changes of its types.
  void processChanges(const ChangesStoragePtr& changes) override;

  // Whether the change set deletes one of the folders.
  bool invalidCurrentFoldersForChanges(const ChangesStoragePtr& changes) const;
  // The folder's children, from the context.
  void obtainEntitiesForFolder(const FolderPtr& folder, EntitiesHandler handler);

 private:
  KRDBBaseFolderFilter() = default;

  KRDBEntitySet folders_;
};
