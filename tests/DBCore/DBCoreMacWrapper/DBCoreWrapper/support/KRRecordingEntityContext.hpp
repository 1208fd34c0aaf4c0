#pragma once

#include <memory>
#include <string>
#include <vector>

#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBEntity/KRDBEntityContext.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"

// A context for entity tests: records the name of every operation an entity calls and the entity it
// asked about, answers each relation with what the test put in it (nil or empty by default), and keeps
// the arguments of the membership changes.
class KRRecordingEntityContext : public KRDBEntityContext {
 public:
  std::vector<std::string> calls;
  // The entity (or folder) of the latest operation.
  std::shared_ptr<void> askedFor;
  // The entities and the folder of every membership change, in order.
  std::vector<KRDBEntitySet> changedEntities;
  std::vector<std::shared_ptr<KRDBEntity>> changedFolders;

  // The answers.
  std::shared_ptr<KRDBEntityFavoriteAlias> alias;
  std::shared_ptr<KRDBAbstractBaseFolder> parent;
  KRDBEntitySet childs;
  KRDBEntitySet images;
  KRDBEntitySet filters;
  std::shared_ptr<KRDBPath> path;
  std::shared_ptr<KRDBImageAttributes> attributes;
  std::shared_ptr<KRDBImageExivAttributes> exivAttributes;
  std::shared_ptr<KRDBImage> image;
  KRDBImageStates states;
  std::shared_ptr<KRDBImageState> currentState;
  std::shared_ptr<KRDBVolume> volume;

  std::shared_ptr<KRDBEntityFavoriteAlias> favoriteAliasForEntity(
      const std::shared_ptr<KRDBEntity>& entity) override {
    return answer("favoriteAliasForEntity", entity, alias);
  }
  std::shared_ptr<KRDBAbstractBaseFolder> parentOfFilter(
      const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    return answer("parentOfFilter", filter, parent);
  }
  KRDBEntitySet childsOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    return answer("childsOfFilter", filter, childs);
  }
  KRDBEntitySet imagesOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    return answer("imagesOfFilter", filter, images);
  }
  KRDBEntitySet filtersOfImage(const std::shared_ptr<KRDBImage>& of) override {
    return answer("filtersOfImage", of, filters);
  }
  void addChilds(const KRDBEntitySet& entities,
                 const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    change("addChilds:toFilter:", entities, filter);
  }
  void addImages(const KRDBEntitySet& entities,
                 const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    change("addImages:toFilter:", entities, filter);
  }
  void addImages(const KRDBEntitySet& entities,
                 const std::shared_ptr<KRDBReferencedFolder>& folder) override {
    change("addImages:toReferencedFolder:", entities, folder);
  }
  void deleteImages(const KRDBEntitySet& entities,
                    const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override {
    change("deleteImages:fromFilter:", entities, filter);
  }
  std::shared_ptr<KRDBPath> pathForReferencedFolder(
      const std::shared_ptr<KRDBReferencedFolder>& folder) override {
    return answer("pathForReferencedFolder", folder, path);
  }
  std::shared_ptr<KRDBImageAttributes> attributesForImage(const std::shared_ptr<KRDBImage>& of) override {
    return answer("attributesForImage", of, attributes);
  }
  std::shared_ptr<KRDBImage> imageForAttributes(const std::shared_ptr<KRDBImageAttributes>& of) override {
    return answer("imageForAttributes", of, image);
  }
  std::shared_ptr<KRDBImageExivAttributes> exivAttributesForImage(
      const std::shared_ptr<KRDBImage>& of) override {
    return answer("exivAttributesForImage", of, exivAttributes);
  }
  std::shared_ptr<KRDBImage> imageForExivAttributes(
      const std::shared_ptr<KRDBImageExivAttributes>& of) override {
    return answer("imageForExivAttributes", of, image);
  }
  KRDBImageStates statesForImage(const std::shared_ptr<KRDBImage>& of) override {
    return answer("statesForImage", of, states);
  }
  std::shared_ptr<KRDBImageState> currentStateForImage(const std::shared_ptr<KRDBImage>& of) override {
    return answer("currentStateForImage", of, currentState);
  }
  void setStates(const KRDBImageStates&, const std::shared_ptr<KRDBImageState>&,
                 const std::shared_ptr<KRDBImage>& of) override {
    answer("setStates:currentState:forImage:", of, nullptr);
  }
  void setCurrentState(const std::shared_ptr<KRDBImageState>&,
                       const std::shared_ptr<KRDBImage>& of) override {
    answer("setCurrentState:forImage:", of, nullptr);
  }
  std::shared_ptr<KRDBVolume> volumeForPath(const std::shared_ptr<KRDBPath>& of) override {
    return answer("volumeForPath", of, volume);
  }

 private:
  template <class Answer>
  Answer answer(const char* operation, std::shared_ptr<void> entity, const Answer& value) {
    calls.emplace_back(operation);
    askedFor = std::move(entity);
    return value;
  }
  void change(const char* operation, const KRDBEntitySet& entities,
              const std::shared_ptr<KRDBEntity>& folder) {
    answer(operation, folder, nullptr);
    changedEntities.push_back(entities);
    changedFolders.push_back(folder);
  }
};
