#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "KRFoundation/KRGeometry.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "Model/KRDBPath/KRDBPathObserver.hpp"
#include "dbimage.hpp"

class KRDBImageAttributes;
class KRDBImageExivAttributes;
class KRDBImageState;
class KRDBPath;

extern const char* const kKRDBImageDidChangeGuid;
extern const char* const kKRDBImageDidChangeName;
extern const char* const kKRDBImageDidChangeWidth;
extern const char* const kKRDBImageDidChangeHeight;
extern const char* const kKRDBImageDidChangeFileSize;
extern const char* const kKRDBImageDidChangeModificationDate;
extern const char* const kKRDBImageDidChangeImportDate;
extern const char* const kKRDBImageDidChangeImportIndex;

// The entity of one photo in the catalog, over a dbcore::DBImage record: the record's values as typed
// properties, values derived from them (file name and type, the size after cropping, the aspect ratio),
// and its linked entities (folder path, user and camera attributes, history states, the folders that hold
// it), fetched lazily through the context. Listens to its folder path. Used on its context's thread.
class KRDBImage : public KRDBConcreteEntity<KRDBImage, KRDBEntity, KRDBEntityTypeImage, dbcore::kDBImageType>,
                  public KRDBPathObserver {
 public:
  using StatesPtr = std::shared_ptr<const KRDBImageStates>;
  using FoldersPtr = std::shared_ptr<const KRDBEntitySet>;

  static const std::vector<std::string>& necessaryLinkedEntitiesKeys();
  // The key of the linked entity that points back at the image for a necessary key, or empty.
  static std::string reverseKeyForNecessaryKey(const std::string& key);

  bool storeInfoFromDBentity(const Record& record) override;
  std::shared_ptr<dbcore::DBImage> dbimage() const;

  // ---- Record properties. Name, sizes, file size and import index compare by value; the guid and the
  // dates by object identity.
  const KRString& guid() const { return guid_; }
  void setGuid(const KRString& guid);
  // The file name with its extension; the record keeps whatever path it was given.
  const KRString& name() const { return name_; }
  void setName(const KRString& name);
  int32_t width() const { return width_; }
  void setWidth(int32_t width);
  int32_t height() const { return height_; }
  void setHeight(int32_t height);
  int64_t fileSize() const { return fileSize_; }
  void setFileSize(int64_t fileSize);
  const KRDate& modificationDate() const { return modificationDate_; }
  void setModificationDate(const KRDate& date);
  const KRDate& importDate() const { return importDate_; }
  void setImportDate(const KRDate& date);
  int32_t importIndex() const { return importIndex_; }
  void setImportIndex(int32_t importIndex);
  const KRDate& creationDate() const { return creationDate_; }
  void setCreationDate(const KRDate& date);

  // ---- Derived values
  // The folder's absolute path with the name appended; nil without a folder path.
  KRString path() const;
  const KRString& fileName();
  const KRString& fileType();
  // The current state's orientation when it is 1 to 8, else 1.
  uint64_t imageOrientation() const;
  // The size after the current state's crop; computed again while it is zero.
  KRSize croppedSize();
  // Width over height of the cropped size (height over width for quarter-turned orientations), as a
  // 32-bit float.
  KRNumber sizeAspectRatio();
  // Computes the ratio; a change of more than 1e-5 is stored and, with `notify`, posted.
  void validateSizeAspectRatioAndNotify(bool notify);
  void validateSizeAspectRatio() { validateSizeAspectRatioAndNotify(true); }
  bool isLost();
  void setLost(bool lost);
  bool isAvailable();
  // The same values from what is cached, without fetching or caching: what key-value reading answers, safe
  // for the concurrent membership tests of live filters.
  KRNumber sizeAspectRatioValue() const;
  bool isLostPrimitive() const;
  bool isAvailablePrimitive() const;
  bool canBeMarkedAsLost();
  bool isPossibleDuplicateOf(const std::shared_ptr<KRDBImage>& other) const;

  // ---- Linked entities: fetched through the context on first read, then cached
  std::shared_ptr<KRDBImageAttributes> attributes();
  const std::shared_ptr<KRDBImageAttributes>& attributesPrimitive() const { return attributes_; }
  void setAttributesPrimitive(const std::shared_ptr<KRDBImageAttributes>& attributes);
  std::shared_ptr<KRDBImageExivAttributes> exivAttributes();
  const std::shared_ptr<KRDBImageExivAttributes>& exivAttributesPrimitive() const { return exivAttributes_; }
  void setExivAttributesPrimitive(const std::shared_ptr<KRDBImageExivAttributes>& attributes);
  FoldersPtr filters();
  const FoldersPtr& filtersPrimitive() const { return filters_; }
  void setFiltersPrimitive(FoldersPtr filters);
  // Fetched only when there is a current state.
  StatesPtr states();
  const StatesPtr& statesPrimitive() const { return states_; }
  void setStatesPrimitive(StatesPtr states);
  const std::shared_ptr<KRDBImageState>& currentState() const { return currentState_; }
  const std::shared_ptr<KRDBImageState>& currentStatePrimitive() const { return currentState_; }
  void setCurrentStatePrimitive(const std::shared_ptr<KRDBImageState>& state);
  const std::shared_ptr<KRDBPath>& folderDBPath() const { return folderDBPath_; }
  const std::shared_ptr<KRDBPath>& folderDBPathPrimitive() const { return folderDBPath_; }
  void setFolderDBPathPrimitive(const std::shared_ptr<KRDBPath>& path) {
    setFolderDBPathPrimitive(path, false);
  }
  // Moves the image's listener registration to the new path; with `notify`, posts the change.
  void setFolderDBPathPrimitive(const std::shared_ptr<KRDBPath>& path, bool notify);
  std::shared_ptr<KRDBEntity> necessaryLinkedEntity(const std::string& key) const override;
  void updateNecessaryEntityForKey(const std::string& key,
                                   const std::shared_ptr<KRDBEntity>& entity) override;

  // ---- Listener of the folder path
  void pathDidChange(const std::shared_ptr<KRDBPath>& path) override;
  void volumeDidUpdate(const std::shared_ptr<KRDBPath>& path) override;

  // ---- Collections, through the context
  void addFilters(const KRDBEntitySet& filters);
  void deleteFilters(const KRDBEntitySet& filters);
  // The folders that were not members yet (now added) / that were members (now removed).
  KRDBEntitySet addFiltersPrimitive(const KRDBEntitySet& filters);
  KRDBEntitySet deleteFiltersPrimitive(const KRDBEntitySet& filters);

  // ---- History, through the context
  void setStates(const KRDBImageStates& states, const std::shared_ptr<KRDBImageState>& currentState);
  void setStates(const KRDBImageStates& states);
  void setCurrentState(const std::shared_ptr<KRDBImageState>& state);
  void pushState(const std::shared_ptr<KRDBImageState>& state);
  // The states up to the current one, then the new state (its crop converted to this image's size).
  KRDBImageStates statesByPushingState(const std::shared_ptr<KRDBImageState>& state);

  KRString markedToDeleteHashKey() const override;
  // Drops the cached relations and the folder path; keeps the favorite alias.
  void reset() override;
  void resetToDefaultState() override;

  // Reads only what is cached: key-value reading never fetches from the context.
  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;
  // Logs the key and ignores the value: images never fail on an unknown key.
  void setValueForUndefinedKey(const KRValue& value, const std::string& key) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  bool storeInfoFromDBImage(const std::shared_ptr<dbcore::DBImage>& image);

 private:
  // The typed form of updateNecessaryEntityForKey for the image's own link keys: false, changing
  // nothing, for another key or an entity of another class (left to key-value coding).
  bool linkedDirectly(const std::string& key, const std::shared_ptr<KRDBEntity>& entity);
  template <class Attributes>
  bool linkAttributes(const std::shared_ptr<Attributes>& attributes);
  std::shared_ptr<KRDBImage> selfImage() { return std::static_pointer_cast<KRDBImage>(self()); }
  void dropSizeCaches();
  KRSize computedCroppedSize() const;
  float aspectRatioOf(const KRSize& size) const;
  void updateModificationDate();
  template <class Selector>
  void notifyImageObservers(Selector selector) {
    notifyObserversWithSelector(selector, selfImage());
  }

  int32_t width_ = 0;
  int32_t height_ = 0;
  int32_t importIndex_ = 0;
  std::shared_ptr<KRDBImageAttributes> attributes_;
  StatesPtr states_;
  std::shared_ptr<KRDBImageState> currentState_;
  std::shared_ptr<KRDBPath> folderDBPath_;
  std::shared_ptr<KRDBImageExivAttributes> exivAttributes_;
  FoldersPtr filters_;
  std::optional<KRString> fileName_;
  std::optional<KRString> fileType_;
  std::optional<float> sizeAspectRatio_;
  KRString guid_;
  KRString name_;
  int64_t fileSize_ = 0;
  KRDate modificationDate_;
  KRDate importDate_;
  KRDate creationDate_;
  KRSize croppedSize_;
};
