#pragma once

#include <memory>
#include <string>
#include <vector>

#include "Model/KRDBEntity/KRDBEntityContext.hpp"

// A context for entity tests: records the name of every operation an entity calls, answers the favorite
// alias it was given and nothing else.
class KRRecordingEntityContext : public KRDBEntityContext {
 public:
  std::vector<std::string> calls;
  std::shared_ptr<KRDBEntityFavoriteAlias> alias;

  std::shared_ptr<KRDBEntityFavoriteAlias> favoriteAliasForEntity(
      const std::shared_ptr<KRDBEntity>&) override {
    return record("favoriteAliasForEntity"), alias;
  }
  std::shared_ptr<KRDBAbstractBaseFolder> parentOfFilter(
      const std::shared_ptr<KRDBAbstractBaseFolder>&) override {
    return record("parentOfFilter"), nullptr;
  }
  KRDBEntitySet childsOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>&) override {
    return record("childsOfFilter"), KRDBEntitySet();
  }
  KRDBEntitySet imagesOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>&) override {
    return record("imagesOfFilter"), KRDBEntitySet();
  }
  KRDBEntitySet filtersOfImage(const std::shared_ptr<KRDBImage>&) override {
    return record("filtersOfImage"), KRDBEntitySet();
  }
  void addChilds(const KRDBEntitySet&, const std::shared_ptr<KRDBAbstractBaseFolder>&) override {
    record("addChilds:toFilter:");
  }
  void addImages(const KRDBEntitySet&, const std::shared_ptr<KRDBAbstractBaseFolder>&) override {
    record("addImages:toFilter:");
  }
  void addImages(const KRDBEntitySet&, const std::shared_ptr<KRDBReferencedFolder>&) override {
    record("addImages:toReferencedFolder:");
  }
  void deleteImages(const KRDBEntitySet&, const std::shared_ptr<KRDBAbstractBaseFolder>&) override {
    record("deleteImages:fromFilter:");
  }
  std::shared_ptr<KRDBPath> pathForReferencedFolder(const std::shared_ptr<KRDBReferencedFolder>&) override {
    return record("pathForReferencedFolder"), nullptr;
  }
  std::shared_ptr<KRDBImageAttributes> attributesForImage(const std::shared_ptr<KRDBImage>&) override {
    return record("attributesForImage"), nullptr;
  }
  std::shared_ptr<KRDBImage> imageForAttributes(const std::shared_ptr<KRDBImageAttributes>&) override {
    return record("imageForAttributes"), nullptr;
  }
  std::shared_ptr<KRDBImageExivAttributes> exivAttributesForImage(
      const std::shared_ptr<KRDBImage>&) override {
    return record("exivAttributesForImage"), nullptr;
  }
  std::shared_ptr<KRDBImage> imageForExivAttributes(
      const std::shared_ptr<KRDBImageExivAttributes>&) override {
    return record("imageForExivAttributes"), nullptr;
  }
  KRDBImageStates statesForImage(const std::shared_ptr<KRDBImage>&) override {
    return record("statesForImage"), KRDBImageStates();
  }
  std::shared_ptr<KRDBImageState> currentStateForImage(const std::shared_ptr<KRDBImage>&) override {
    return record("currentStateForImage"), nullptr;
  }
  void setStates(const KRDBImageStates&, const std::shared_ptr<KRDBImageState>&,
                 const std::shared_ptr<KRDBImage>&) override {
    record("setStates:currentState:forImage:");
  }
  void setCurrentState(const std::shared_ptr<KRDBImageState>&, const std::shared_ptr<KRDBImage>&) override {
    record("setCurrentState:forImage:");
  }
  std::shared_ptr<KRDBVolume> volumeForPath(const std::shared_ptr<KRDBPath>&) override {
    return record("volumeForPath"), nullptr;
  }

 private:
  void record(const char* operation) { calls.emplace_back(operation); }
};
