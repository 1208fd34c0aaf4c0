#pragma once

#include <memory>
#include <unordered_set>
#include <vector>

class KRDBEntity;
class KRDBEntityFavoriteAlias;
class KRDBAbstractBaseFolder;
class KRDBReferencedFolder;
class KRDBImage;
class KRDBImageAttributes;
class KRDBImageExivAttributes;
class KRDBImageState;
class KRDBPath;
class KRDBVolume;

// A set of entities, members by identity.
using KRDBEntitySet = std::unordered_set<std::shared_ptr<KRDBEntity>>;
using KRDBImageStates = std::vector<std::shared_ptr<KRDBImageState>>;

// The context operations that entities call: their relations, memberships and history states. The
// context implements it; an entity holds it weakly and does nothing once it is gone. Called on the
// context's thread.
class KRDBEntityContext {
 public:
  virtual ~KRDBEntityContext() = default;

  // The entity's favorite alias, made by the catalog when there is none yet.
  virtual std::shared_ptr<KRDBEntityFavoriteAlias> favoriteAliasForEntity(
      const std::shared_ptr<KRDBEntity>& entity) = 0;

  // Folder trees and memberships.
  virtual std::shared_ptr<KRDBAbstractBaseFolder> parentOfFilter(
      const std::shared_ptr<KRDBAbstractBaseFolder>& filter) = 0;
  virtual KRDBEntitySet childsOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter) = 0;
  virtual KRDBEntitySet imagesOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter) = 0;
  virtual KRDBEntitySet filtersOfImage(const std::shared_ptr<KRDBImage>& image) = 0;
  virtual void addChilds(const KRDBEntitySet& childs,
                         const std::shared_ptr<KRDBAbstractBaseFolder>& filter) = 0;
  virtual void addImages(const KRDBEntitySet& images,
                         const std::shared_ptr<KRDBAbstractBaseFolder>& filter) = 0;
  virtual void addImages(const KRDBEntitySet& images,
                         const std::shared_ptr<KRDBReferencedFolder>& folder) = 0;
  virtual void deleteImages(const KRDBEntitySet& images,
                            const std::shared_ptr<KRDBAbstractBaseFolder>& filter) = 0;
  virtual std::shared_ptr<KRDBPath> pathForReferencedFolder(
      const std::shared_ptr<KRDBReferencedFolder>& folder) = 0;

  // An image's attribute records and the other way round.
  virtual std::shared_ptr<KRDBImageAttributes> attributesForImage(
      const std::shared_ptr<KRDBImage>& image) = 0;
  virtual std::shared_ptr<KRDBImage> imageForAttributes(
      const std::shared_ptr<KRDBImageAttributes>& attributes) = 0;
  virtual std::shared_ptr<KRDBImageExivAttributes> exivAttributesForImage(
      const std::shared_ptr<KRDBImage>& image) = 0;
  virtual std::shared_ptr<KRDBImage> imageForExivAttributes(
      const std::shared_ptr<KRDBImageExivAttributes>& attributes) = 0;

  // History states.
  virtual KRDBImageStates statesForImage(const std::shared_ptr<KRDBImage>& image) = 0;
  virtual std::shared_ptr<KRDBImageState> currentStateForImage(const std::shared_ptr<KRDBImage>& image) = 0;
  virtual void setStates(const KRDBImageStates& states, const std::shared_ptr<KRDBImageState>& currentState,
                         const std::shared_ptr<KRDBImage>& image) = 0;
  virtual void setCurrentState(const std::shared_ptr<KRDBImageState>& state,
                               const std::shared_ptr<KRDBImage>& image) = 0;

  // The volume that holds a folder path.
  virtual std::shared_ptr<KRDBVolume> volumeForPath(const std::shared_ptr<KRDBPath>& path) = 0;
};
