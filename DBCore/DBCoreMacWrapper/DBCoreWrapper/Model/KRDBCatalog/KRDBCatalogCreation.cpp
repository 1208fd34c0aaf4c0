#include <algorithm>
#include <string>
#include <utility>

#include "KRClasses/KRTCropDescription.hpp"
#include "KRFoundation/KRUTF.hpp"
#include "KRFoundation/KRUUID.hpp"
#include "KRServices/KRLog.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBCollectionAttributes/KRDBCollectionAttributes.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBExifReader.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBRefFolderAttributes/KRDBRefFolderAttributes.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"
#include "Model/KRDBSmartFilterAttributes/KRDBSmartFilterAttributes.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "Support/KRDBRecordConversions.hpp"
#include "Support/KRDBRecordFieldConversion.hpp"
#include "Support/KRDictionaryJSON.hpp"
#include "dbreactor.hpp"

// Creation of records from info dictionaries, and the attribute records of images and folders.

using dbcore::DBEntity;
using dbcore::DBExivImgAttrib;
using dbcore::DBImage;
using dbcore::DBImgHistoryState;
using dbcore::DBPath;
using dbcore::DBRefFolder;
using dbcore::DBRefFolderNode;
using dbcore::DBRefFolderTree;
using dbcore::DBUserImgAttrib;
using Reactor = KRDBCatalog::Reactor;
using Conversions = KRDBRecordConversions;

namespace {

const char* const kCreateImageOperation = "CreateDBImage";
const char* const kCreateImageArrayOperation = "CreateDBImageArray";
const char* const kBindImagesOperation = "BindDBAttributesDBImageArray";
const char* const kCreatePathArrayOperation = "CreateDBPathArray";
const char* const kCreateRefFolderTreesOperation = "createDBRefFoldersWithEntitiesInfo:";
const char* const kCreateRefFolderOperation = "CreateDBRefFolder";
const char* const kCreateFilterOperation = "CreateDBFilter";
const char* const kCreateSmartFilterOperation = "CreateDBSmartFilter";
const char* const kCreateVolumeOperation = "CreateDBVolume";
const char* const kCreateStateOperation = "CreateDBState";
const char* const kBindResourcesOperation = "BindStateWithResources";
const char* const kBindBaseStateResourcesOperation = "BindStateWithResourcesFromBaseStateID";
const char* const kCreateFilterAttributesOperation = "CreateFilterAttributes";
const char* const kCreateRefFolderAttributesOperation = "CreateRefFolderAttributes";
const char* const kCreateSmartFilterAttributesOperation = "CreateSmartFilterAttributes";

const char* const kImageInfoExifReader = "DBImageInfoExifReader";
const char* const kImageImportTimeInterval = "DBImageImportTimeIntervalNumber";
const char* const kImageImportIndex = "DBImageImportIndex";
const char* const kImageInfoImageName = "DBImageInfoImageName";
const char* const kImageInfoOriginImageName = "DBImageInfoOriginImageName";
const char* const kImageInfoFolderDBPath = "DBImageInfoFolderDBPath";
const char* const kPathInfoPath = "DBPathInfoPath";
const char* const kPathInfoVolume = "DBPathInfoVolume";
const char* const kReferencedFolderPath = "DBReferencedFolderPath";
const char* const kReferencedFolderParent = "DBReferencedFolderParent";
const char* const kReferencedFolderChildsPaths = "DBReferencedFolderChildsPaths";
const char* const kVolumeInfo = "DBVolumeInfo";
const char* const kStateGuid = "guid";
const char* const kStateActionName = "actionName";
const char* const kStateAdditionalInfo = "additionalInfo";
const char* const kStateCropInfo = "cropInfo";
const char* const kStateOrientation = "imageOrientationInfo";
const char* const kStateHash = "hash";
const char* const kStateOriginal = "original";
const char* const kStateResources = "resourcesArray";
const char* const kStateBaseStateID = "baseStateID";

// The root of the referenced-folder tree: the parent of a folder created without one.
constexpr long long kRefFolderRootID = 1;

// Typed reads of a creation info. A missing key gives nil; a value of the wrong kind gives nil too, with a
// warning, so that bad input never reaches a record. Made and read on the catalog's queue.
class CreationInfo {
 public:
  explicit CreationInfo(KRDictionary info) : info_(std::move(info)) {}

  bool has(const char* key) const { return !value(key).isNil(); }

  KRString string(const char* key) const {
    const KRString text = typed(key, KRValue::Type::String, &KRValue::string, "a string");
    if (text && KRUTF::utf8FromWide(KRUTF::wideFromUTF8(text.str())) != text.str()) {
      KRLog(KRLogLevelWarning, "Ignoring the value under %s of a creation info: it is not UTF-8 text", key);
      return {};
    }
    return text;
  }
  KRNumber number(const char* key) const {
    return typed(key, KRValue::Type::Number, &KRValue::number, "a number");
  }
  KRDictionary dictionary(const char* key) const {
    return typed(key, KRValue::Type::Dictionary, &KRValue::dictionary, "a dictionary");
  }
  KRArray array(const char* key) const {
    return typed(key, KRValue::Type::Array, &KRValue::array, "an array");
  }
  template <class T>
  std::shared_ptr<T> object(const char* key, const char* expected) const {
    const KRValue& found = value(key);
    if (found.isNil()) return nullptr;
    if (auto object = found.objectAs<T>()) return object;
    ignored(key, found, expected);
    return nullptr;
  }

  // The exif reader of an image info: nil, with a warning, when there is none or its url is not an
  // absolute path.
  std::shared_ptr<KRDBExifReader> exifReader() const {
    if (!has(kImageInfoExifReader)) {
      KRLog(KRLogLevelWarning,
            "An image info has no exif reader: the image gets no size, file size or dates");
      return nullptr;
    }
    auto reader = object<KRDBExifReader>(kImageInfoExifReader, "an exif reader");
    if (!reader) return nullptr;
    if (!reader->url().hasPrefix("/")) {
      KRLog(KRLogLevelWarning,
            "Ignoring the exif reader of an image info: its url %@ is not an absolute path", reader->url());
      return nullptr;
    }
    return reader;
  }

 private:
  const KRValue& value(const char* key) const {
    static const KRValue nil;
    return info_.isNil() ? nil : info_.objectForKey(key);
  }
  // The value under the key as one kind of handle (`view`); nil when missing or, logged, of another kind.
  template <class T>
  T typed(const char* key, KRValue::Type type, T (KRValue::*view)() const, const char* expected) const {
    const KRValue& found = value(key);
    if (found.isNil() || found.type() == type) return (found.*view)();
    ignored(key, found, expected);
    return {};
  }
  static void ignored(const char* key, const KRValue& found, const char* expected) {
    KRLog(KRLogLevelWarning, "Ignoring the value under %s of a creation info: %@ is not %s", key, found,
          expected);
  }

  KRDictionary info_;
};

std::wstring newUUID() { return Conversions::wideString(KRUUID::UUIDString()); }

long long dbidOf(const std::shared_ptr<KRDBEntity>& entity) {
  return entity && entity->entityID() ? entity->entityID()->dbid() : 0;
}

template <class Entity>
std::shared_ptr<Entity> wrap(const std::shared_ptr<DBEntity>& record) {
  return Entity::initWithDBEntity(record);
}

// Gives a new image its two attribute records as entities, linked both ways, so that it is complete in
// memory as it is in the catalog.
void attachAttributes(const std::shared_ptr<KRDBImage>& image, const std::shared_ptr<DBUserImgAttrib>& user,
                      const std::shared_ptr<DBExivImgAttrib>& exif) {
  const auto attributes = wrap<KRDBImageAttributes>(user);
  attributes->setImagePrimitive(image);
  image->setAttributesPrimitive(attributes);
  const auto exivAttributes = wrap<KRDBImageExivAttributes>(exif);
  exivAttributes->setImagePrimitive(image);
  image->setExivAttributesPrimitive(exivAttributes);
}

// Fills an image record from its info: the reader's size, file size and dates, the import date and index
// and the name.
std::shared_ptr<DBImage> imageRecord(const CreationInfo& info,
                                     const std::shared_ptr<KRDBExifReader>& reader) {
  auto image = std::make_shared<DBImage>();
  image->guid = newUUID();
  if (reader) {
    image->width = KRDBRecordFieldConversion::toRecord<int32_t>(reader->width());
    image->height = KRDBRecordFieldConversion::toRecord<int32_t>(reader->height());
    image->file_size = reader->fileSize();
    image->modification_date = Conversions::seconds(reader->modificationDate());
    image->creation_date = Conversions::seconds(reader->fileCreationDate());
  }
  if (const KRNumber importDate = info.number(kImageImportTimeInterval))
    image->import_date =
        Conversions::seconds(KRDate::dateWithTimeIntervalSince1970(importDate.doubleValue()));
  if (const KRNumber importIndex = info.number(kImageImportIndex))
    image->import_index = importIndex.intValue();
  if (const KRString name = info.string(kImageInfoImageName)) image->path = Conversions::wideString(name);
  return image;
}

// Fills a history state record from its info.
std::shared_ptr<DBImgHistoryState> stateRecord(const CreationInfo& info) {
  auto state = std::make_shared<DBImgHistoryState>();
  state->guid = Conversions::wideString(info.string(kStateGuid));
  state->action_name = Conversions::wideString(info.string(kStateActionName));
  state->additional_info = Conversions::wideString(info.string(kStateAdditionalInfo));
  if (const auto crop = info.object<KRTCropDescription>(kStateCropInfo, "a crop description"))
    state->crop_description = KRUTF::wideFromUTF8(crop->plistSerialization());
  if (const KRNumber orientation = info.number(kStateOrientation))
    state->image_orientation = static_cast<uint64_t>(orientation.longLongValue());
  const KRString hash = info.string(kStateHash);
  state->state_hash = Conversions::wideString(hash ? hash : KRUUID::UUIDString());
  const KRNumber original = info.number(kStateOriginal);
  state->original = original && original.boolValue();
  return state;
}

// The resource names of a state info, as wide strings in order; other values are skipped with a warning.
std::vector<std::wstring> resourceNames(const CreationInfo& info) {
  std::vector<std::wstring> names;
  const KRArray resources = info.array(kStateResources);
  if (resources.isNil()) return names;
  for (const KRValue& name : resources.values()) {
    const KRString text = CreationInfo(KRDictionary{{"name", name}}).string("name");
    if (text) names.push_back(Conversions::wideString(text));
  }
  return names;
}

// The child path strings of a tree info, sorted with the locale's collation.
std::vector<KRString> sortedChildPaths(const KRDictionary& childs) {
  std::vector<KRString> paths;
  for (const auto& [key, child] : childs.entries()) {
    if (key.isString()) {
      paths.push_back(key.string());
    } else {
      KRLog(KRLogLevelWarning, "Ignoring a child of a referenced folder info: its path %@ is not a string",
            key);
    }
  }
  std::sort(paths.begin(), paths.end(),
            [](const KRString& a, const KRString& b) { return a.localizedCompare(b) == KROrderedAscending; });
  return paths;
}

// A referenced-folder tree being built: each engine node with its volume, the path entity it was given
// (the root's) and its children. Built and read on the catalog's queue.
struct TreeNode {
  std::shared_ptr<DBRefFolderNode> node;
  std::shared_ptr<KRDBVolume> volume;
  std::shared_ptr<KRDBPath> pathEntity;
  std::vector<TreeNode> children;
};

// Adds a node for each child path of the info under `parent`, in collation order, and their own children
// from each child's info ("DBReferencedFolderChildsPaths" again). A child's volume is its info's
// "DBPathInfoVolume", else its parent's.
void addChildNodes(DBRefFolderTree& tree, TreeNode& parent, const CreationInfo& info) {
  const KRDictionary childs = info.dictionary(kReferencedFolderChildsPaths);
  if (childs.isNil()) return;
  for (const KRString& path : sortedChildPaths(childs)) {
    const CreationInfo childInfo(CreationInfo(childs).dictionary(path.c_str()));
    const auto childVolume = childInfo.object<KRDBVolume>(kPathInfoVolume, "a volume");
    TreeNode child{nullptr, childVolume ? childVolume : parent.volume, nullptr, {}};
    auto folder = std::make_shared<DBRefFolder>();
    folder->uuid = newUUID();
    auto record = std::make_shared<DBPath>();
    record->path = Conversions::wideString(path);
    record->volume_id = dbidOf(child.volume);
    child.node = tree.add_node(parent.node, {folder, record});
    addChildNodes(tree, child, childInfo);
    parent.children.push_back(std::move(child));
  }
}

// Wraps a written node and its children, links them, and appends every folder to `result`.
std::shared_ptr<KRDBReferencedFolder> wrapTreeNode(const TreeNode& built,
                                                   const std::shared_ptr<KRDBReferencedFolder>& parent,
                                                   KRDBEntityArray& result) {
  auto folder = wrap<KRDBReferencedFolder>(built.node->folder());
  auto path = built.pathEntity ? built.pathEntity : wrap<KRDBPath>(built.node->path());
  path->setVolumePrimitive(built.volume);
  folder->setParentPrimitive(parent);
  folder->setDbPath(path);
  result.push_back(folder);
  auto childs = std::make_shared<KRDBEntitySet>();
  for (const TreeNode& child : built.children) childs->insert(wrapTreeNode(child, folder, result));
  folder->setSubfiltersPrimitive(std::move(childs), false);
  return folder;
}

}  // namespace

// ---- Creation

std::shared_ptr<KRDBEntity> KRDBCatalog::createEntityWithTypeSync(int64_t entityType,
                                                                  const KRDictionary& additionalInfo) {
  const CreationInfo info(additionalInfo);
  switch (entityType) {
    case KRDBEntityTypeImage: {
      if (!additionalInfo.isNil()) {
        const KRDBEntityArray images = createDBImagesWithEntitiesInfo({additionalInfo});
        return images.empty() ? nullptr : images.front();
      }
      auto record = std::make_shared<DBImage>();
      record->guid = newUUID();
      record->path = newUUID();
      handleDBReactorBlock([&record](const Reactor& reactor) { *reactor << record; }, kCreateImageOperation,
                           true);
      auto image = wrap<KRDBImage>(record);
      updateEntitySync(fetchAttributesForImageSync(image));
      updateEntitySync(fetchExivAttributesForImageSync(image));
      return image;
    }
    case KRDBEntityTypeCollection: {
      auto record = std::make_shared<dbcore::DBFilter>();
      handleDBReactorBlock([&record](const Reactor& reactor) { *reactor << record; }, kCreateFilterOperation,
                           true);
      auto filter = wrap<KRDBCollection>(record);
      additionalFetchingForFilter(filter);
      return filter;
    }
    case KRDBEntityTypeReferencedFolder: {
      const auto path = info.object<KRDBPath>(kReferencedFolderPath, "a path");
      if (!path) return nullptr;
      const auto parent = info.object<KRDBReferencedFolder>(kReferencedFolderParent, "a referenced folder");
      const long long parentID = parent ? dbidOf(parent) : kRefFolderRootID;
      auto record = std::make_shared<DBRefFolder>();
      record->uuid = newUUID();
      const auto pathRecord = path->dbpath();
      const bool pathWasSaved = pathRecord && pathRecord->is_saved();
      const dbcore::DBind<DBRefFolder, long long, std::shared_ptr<DBPath>> binding(record, parentID,
                                                                                   pathRecord);
      const bool written = handleDBReactorBlock([&binding](const Reactor& reactor) { *reactor << binding; },
                                                kCreateRefFolderOperation, false);
      if (!written) {
        // The write was rolled back: the records keep no id of rows that do not exist.
        record->set_id(0);
        if (pathRecord && !pathWasSaved) pathRecord->set_id(0);
      }
      auto folder = wrap<KRDBReferencedFolder>(record);
      // A folder that is not in the catalog gets no attribute record.
      if (written) folder->setAttributesPrimitive(fetchAttributesForRefFolderSync(folder));
      folder->setParentPrimitive(parent);
      folder->setDbPath(path);
      return folder;
    }
    case KRDBEntityTypeImageState: {
      auto record = stateRecord(info);
      handleDBReactorBlock([&record](const Reactor& reactor) { *reactor << record; }, kCreateStateOperation,
                           true);
      const std::vector<std::wstring> resources = resourceNames(info);
      if (!resources.empty()) {
        handleDBReactorBlock(
            [&](const Reactor& reactor) { reactor->BindStateWithResources(record, resources); },
            kBindResourcesOperation, true);
      }
      if (const KRNumber baseStateID = info.number(kStateBaseStateID)) {
        handleDBReactorBlock(
            [&](const Reactor& reactor) {
              reactor->BindStateWithResourcesFromBaseStateID(record, baseStateID.longLongValue());
            },
            kBindBaseStateResourcesOperation, true);
      }
      return wrap<KRDBImageState>(record);
    }
    case KRDBEntityTypeSmartFilter: {
      auto record = std::make_shared<dbcore::DBSmartFilter>();
      handleDBReactorBlock([&record](const Reactor& reactor) { *reactor << record; },
                           kCreateSmartFilterOperation, true);
      auto filter = wrap<KRDBSmartFilter>(record);
      additionalFetchingForSmartFilter(filter);
      return filter;
    }
    case KRDBEntityTypeVolume: {
      auto record = std::make_shared<dbcore::DBVolume>();
      record->uuid = newUUID();
      record->info = KRDictionaryJSON::jsonWString(info.dictionary(kVolumeInfo));
      handleDBReactorBlock([&record](const Reactor& reactor) { *reactor << record; }, kCreateVolumeOperation,
                           true);
      return wrap<KRDBVolume>(record);
    }
    default:
      return nullptr;
  }
}

KRDBEntityArray KRDBCatalog::createEntitiesWithTypeSync(int64_t entityType,
                                                        const std::vector<KRDictionary>& entitiesInfo) {
  switch (entityType) {
    case KRDBEntityTypeImage:
      return createDBImagesWithEntitiesInfo(entitiesInfo);
    case KRDBEntityTypePath:
      return createDBPathsWithEntitiesInfo(entitiesInfo);
    case KRDBEntityTypeReferencedFolder:
      return createDBRefFoldersWithEntitiesInfo(entitiesInfo);
    default: {
      KRDBEntityArray entities;
      for (const KRDictionary& info : entitiesInfo) {
        if (auto entity = createEntityWithTypeSync(entityType, info)) entities.push_back(std::move(entity));
      }
      return entities;
    }
  }
}

KRDBEntityArray KRDBCatalog::createDBImagesWithEntitiesInfo(const std::vector<KRDictionary>& entitiesInfo) {
  std::vector<std::shared_ptr<KRDBExifReader>> readers;
  std::vector<std::shared_ptr<DBImage>> records;
  for (const KRDictionary& entityInfo : entitiesInfo) {
    const CreationInfo info(entityInfo);
    readers.push_back(info.exifReader());
    records.push_back(imageRecord(info, readers.back()));
  }
  KRDBEntityArray images;
  std::vector<std::shared_ptr<DBUserImgAttrib>> userAttributes;
  std::vector<std::shared_ptr<DBExivImgAttrib>> exifAttributes;
  std::vector<std::pair<std::shared_ptr<DBPath>, std::shared_ptr<DBImage>>> folderLinks;
  const auto writeImages = [&](const Reactor& reactor) { *reactor << records; };
  const auto writeLinks = [&](const Reactor& reactor) {
    *reactor << userAttributes << exifAttributes << folderLinks;
  };
  // Both writes are one commit: the links are built between them, once the images have their ids.
  handleDBReactorBlock(
      [&](const Reactor& reactor) {
        reactor->Batch([&] {
          handleDBReactorBlock(writeImages, kCreateImageArrayOperation, true);
          for (size_t index = 0; index < records.size(); ++index) {
            const CreationInfo info(entitiesInfo[index]);
            const auto& record = records[index];
            auto user = std::make_shared<DBUserImgAttrib>();
            user->image_id = record->id();
            user->origin_name = Conversions::wideString(info.string(kImageInfoOriginImageName));
            userAttributes.push_back(user);
            auto image = wrap<KRDBImage>(record);
            auto exif = std::make_shared<DBExivImgAttrib>();
            exif->image_id = record->id();
            wrap<KRDBImageExivAttributes>(exif)->updateByExifReader(readers[index]);
            exifAttributes.push_back(exif);
            auto folder = info.object<KRDBPath>(kImageInfoFolderDBPath, "a path");
            if (folder && !folder->dbpath()->is_saved()) {
              KRLog(KRLogLevelWarning,
                    "Ignoring the folder of an image info: its path %@ is not in the catalog",
                    folder->path());
              folder.reset();
            }
            if (folder) folderLinks.emplace_back(folder->dbpath(), record);
            image->setFolderDBPathPrimitive(folder);
            images.push_back(std::move(image));
          }
          handleDBReactorBlock(writeLinks, kBindImagesOperation, true);
        });
      },
      kCreateImageArrayOperation, true);
  for (size_t index = 0; index < images.size(); ++index) {
    attachAttributes(std::static_pointer_cast<KRDBImage>(images[index]), userAttributes[index],
                     exifAttributes[index]);
  }
  return images;
}

KRDBEntityArray KRDBCatalog::createDBPathsWithEntitiesInfo(const std::vector<KRDictionary>& entitiesInfo) {
  std::vector<std::shared_ptr<DBPath>> records;
  std::vector<std::shared_ptr<KRDBVolume>> volumes;
  for (const KRDictionary& entityInfo : entitiesInfo) {
    const CreationInfo info(entityInfo);
    auto record = std::make_shared<DBPath>();
    record->path = Conversions::wideString(info.string(kPathInfoPath));
    volumes.push_back(info.object<KRDBVolume>(kPathInfoVolume, "a volume"));
    record->volume_id = dbidOf(volumes.back());
    records.push_back(std::move(record));
  }
  handleDBReactorBlock([&records](const Reactor& reactor) { reactor->Batch([&] { *reactor << records; }); },
                       kCreatePathArrayOperation, true);
  KRDBEntityArray paths;
  for (size_t index = 0; index < records.size(); ++index) {
    auto path = wrap<KRDBPath>(records[index]);
    path->setVolumePrimitive(volumes[index]);
    paths.push_back(std::move(path));
  }
  return paths;
}

KRDBEntityArray KRDBCatalog::createDBRefFoldersWithEntitiesInfo(
    const std::vector<KRDictionary>& entitiesInfo) {
  KRDBEntityArray folders;
  const auto createTree = [this, &folders](const CreationInfo& info) {
    const auto path = info.object<KRDBPath>(kReferencedFolderPath, "a path");
    if (!path) return;
    const auto parent = info.object<KRDBReferencedFolder>(kReferencedFolderParent, "a referenced folder");
    const auto volume = info.object<KRDBVolume>(kPathInfoVolume, "a volume");
    auto folder = std::make_shared<DBRefFolder>();
    folder->uuid = newUUID();
    if (volume) path->dbpath()->volume_id = dbidOf(volume);
    auto tree = std::make_shared<DBRefFolderTree>(dbcore::DBRefFolderPathPair{folder, path->dbpath()},
                                                  parent ? dbidOf(parent) : kRefFolderRootID);
    TreeNode root{tree->root(), volume ? volume : path->volumePrimitive(), path, {}};
    addChildNodes(*tree, root, info);
    handleDBReactorBlock([&tree](const Reactor& reactor) { *reactor << tree; },
                         kCreateRefFolderTreesOperation, true);
    wrapTreeNode(root, parent, folders);
  };
  handleDBReactorBlock(
      [&](const Reactor& reactor) {
        reactor->Batch([&] {
          for (const KRDictionary& entityInfo : entitiesInfo) {
            const CreationInfo info(entityInfo);
            if (!info.has(kReferencedFolderChildsPaths)) {
              if (auto folder = createEntityWithTypeSync(KRDBEntityTypeReferencedFolder, entityInfo))
                folders.push_back(std::move(folder));
            } else {
              createTree(info);
            }
          }
        });
      },
      kCreateRefFolderTreesOperation, true);
  return KRDBEntityArray(folders);
}

void KRDBCatalog::createEntityWithType(int64_t entityType, const KRDictionary& additionalInfo,
                                       EntityHandler handler, bool sync) {
  performOperation<std::shared_ptr<KRDBEntity>>(
      [entityType, additionalInfo](KRDBCatalog& catalog) {
        return catalog.createEntityWithTypeSync(entityType, additionalInfo);
      },
      std::move(handler), sync);
}

void KRDBCatalog::createEntityWithType(int64_t entityType, EntityHandler handler, bool sync) {
  createEntityWithType(entityType, KRDictionary(), std::move(handler), sync);
}

void KRDBCatalog::createEntitiesWithType(int64_t entityType, const std::vector<KRDictionary>& entitiesInfo,
                                         EntitiesHandler handler, bool sync) {
  performOperation<KRDBEntityArray>(
      [entityType, entitiesInfo](KRDBCatalog& catalog) {
        return catalog.createEntitiesWithTypeSync(entityType, entitiesInfo);
      },
      std::move(handler), sync);
}

// ---- Attribute records

namespace {

// The attribute record of an image (a new unsaved one when the image has none yet), wrapped and pointing
// back at the image; nil without an engine or an image.
template <class Attributes, class Record>
std::shared_ptr<Attributes> imageAttributes(const Reactor& reactor, const std::shared_ptr<KRDBImage>& image) {
  if (!reactor || !image) return nullptr;
  auto attributes = wrap<Attributes>(reactor->GetBy<Record, DBImage>(image->dbimage()));
  if (attributes) attributes->setImagePrimitive(image);
  return attributes;
}

}  // namespace

std::shared_ptr<KRDBImageAttributes> KRDBCatalog::fetchAttributesForImageSync(
    const std::shared_ptr<KRDBImage>& image) {
  return imageAttributes<KRDBImageAttributes, DBUserImgAttrib>(dbReactor(), image);
}

std::shared_ptr<KRDBImageExivAttributes> KRDBCatalog::fetchExivAttributesForImageSync(
    const std::shared_ptr<KRDBImage>& image) {
  return imageAttributes<KRDBImageExivAttributes, DBExivImgAttrib>(dbReactor(), image);
}

namespace {

// The attribute record of a folder record; when it has none, a new one is written through the guard under
// `description`. Nil without an engine or a folder record.
template <class Attributes, class AttributesRecord, class FolderRecord>
std::shared_ptr<Attributes> folderAttributes(KRDBCatalog& catalog,
                                             const std::shared_ptr<FolderRecord>& folder,
                                             int64_t AttributesRecord::*folderID, const char* description) {
  const Reactor reactor = catalog.dbReactor();
  if (!reactor || !folder) return nullptr;
  auto attributes = reactor->template GetAttributes<AttributesRecord, FolderRecord>(folder);
  if (!attributes) {
    attributes = std::make_shared<AttributesRecord>();
    (*attributes).*folderID = folder->id();
    catalog.handleDBReactorBlock(
        [&attributes](const Reactor& engine) { *engine << std::shared_ptr<DBEntity>(attributes); },
        description, true);
  }
  return wrap<Attributes>(attributes);
}

}  // namespace

std::shared_ptr<KRDBCollectionAttributes> KRDBCatalog::fetchAttributesForFilterSync(
    const std::shared_ptr<KRDBCollection>& filter) {
  return folderAttributes<KRDBCollectionAttributes, dbcore::DBFilterAttrib>(
      *this, filter ? filter->dbfilter() : nullptr, &dbcore::DBFilterAttrib::filter_id,
      kCreateFilterAttributesOperation);
}

std::shared_ptr<KRDBRefFolderAttributes> KRDBCatalog::fetchAttributesForRefFolderSync(
    const std::shared_ptr<KRDBReferencedFolder>& folder) {
  return folderAttributes<KRDBRefFolderAttributes, dbcore::DBRefFolderAttrib>(
      *this, folder ? folder->dbfilter() : nullptr, &dbcore::DBRefFolderAttrib::ref_folder_id,
      kCreateRefFolderAttributesOperation);
}

std::shared_ptr<KRDBSmartFilterAttributes> KRDBCatalog::fetchAttributesForSmartFilterSync(
    const std::shared_ptr<KRDBSmartFilter>& filter) {
  return folderAttributes<KRDBSmartFilterAttributes, dbcore::DBSmartFilterAttrib>(
      *this, filter ? filter->dbsmartfilter() : nullptr, &dbcore::DBSmartFilterAttrib::smart_filter_id,
      kCreateSmartFilterAttributesOperation);
}

namespace {

// Attaches the folder's attributes; the attached entity, or nothing.
template <class Folder, class Fetch>
KRDBEntityArray attachFolderAttributes(const std::shared_ptr<Folder>& folder, Fetch fetch) {
  if (!folder) return {};
  auto attributes = fetch(folder);
  folder->setAttributesPrimitive(attributes);
  if (!attributes) return {};
  return {attributes};
}

}  // namespace

KRDBEntityArray KRDBCatalog::additionalFetchingForFilter(const std::shared_ptr<KRDBCollection>& filter) {
  return attachFolderAttributes(filter,
                                [this](const auto& folder) { return fetchAttributesForFilterSync(folder); });
}

KRDBEntityArray KRDBCatalog::additionalFetchingForSmartFilter(
    const std::shared_ptr<KRDBSmartFilter>& filter) {
  return attachFolderAttributes(
      filter, [this](const auto& folder) { return fetchAttributesForSmartFilterSync(folder); });
}
