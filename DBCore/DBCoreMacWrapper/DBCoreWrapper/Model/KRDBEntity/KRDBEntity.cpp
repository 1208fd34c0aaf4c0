#include "Model/KRDBEntity/KRDBEntity.hpp"

#include <algorithm>
#include <mutex>

#include "KRFoundation/KRException.hpp"
#include "KRServices/KRLog.hpp"
#include "Model/KRDBEntity/KRDBEntityObserver.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "dbentity.hpp"

const char* const kKRDBEntityDidNotChange = "kKRDBEntityDidNotChange";
const char* const kKRDBEntityMarkedToDelete = "KRDBEntityMarkedToDelete";

namespace {

const char* const kImageInfoExifReader = "DBImageInfoExifReader";
const char* const kPathInfoPath = "DBPathInfoPath";
const char* const kURLKey = "url";

}  // namespace

// The favorite alias comes first in this file: the report of an inconsistent alias is known by its
// line, which is part of the log interface (line 38). Whoever edits the lines above it keeps that so;
// the entity's test checks the line.
//
// Asks the context for the alias when there is none yet (without a context, nothing happens).
// An alias gives its entity back through originalEntityPrimitive. When the alias already names another
// entity, the catalog's relation was inconsistent: that is reported, and the last entity to ask wins.
void KRDBEntity::createFavoriteAliasIfNeeded() {
  if (favoriteAliasPrimitive()) return;
  const auto owner = context();
  if (!owner) return;
  const auto alias = rare().favoriteAlias = owner->favoriteAliasForEntity(self());
  if (!alias) return;
  const auto original = alias->originalEntityPrimitive();
  if (original && original.get() != this) {
    KRLog(KRLogLevelError, "Error: Inconsistence in favoriteAlias - entity relation");
  }
  alias->setOriginalEntityPrimitive(self());
}

const std::shared_ptr<KRDBEntityFavoriteAlias>& KRDBEntity::favoriteAliasPrimitive() const {
  static const std::shared_ptr<KRDBEntityFavoriteAlias> none;
  return rare_ ? rare_->favoriteAlias : none;
}

void KRDBEntity::setFavoriteAliasPrimitive(std::shared_ptr<KRDBEntityFavoriteAlias> alias) {
  if (alias || rare_) rare().favoriteAlias = std::move(alias);
}

KRDBEntity::Rare& KRDBEntity::rare() {
  if (!rare_) rare_ = std::make_unique<Rare>();
  return *rare_;
}

KRDBEntity::KRDBEntity(Record record)
    : entityID_(KRDBEntityID::initWithEntityType(entityTypeForDBEntityType(record->type()), record->id())),
      dbentity_(std::move(record)),
      markedToDelete_(dbentity_->marked_to_delete()) {}

// ---- Registry

void KRDBEntity::registerEntityClass(const KRDBEntityClass& entityClass) {
  if (entityClass.dbEntityType == 0) return;
  dbEntityTypeToClassMap()[entityClass.dbEntityType] = &entityClass;
}

KRDBEntity::ClassMap& KRDBEntity::dbEntityTypeToClassMap() {
  static std::once_flag once;
  static ClassMap* map = nullptr;
  std::call_once(once, [] { map = new ClassMap(); });
  return *map;
}

const KRDBEntityClass* KRDBEntity::entityClassForDBEntityType(uint8_t dbEntityType) {
  const ClassMap& map = dbEntityTypeToClassMap();
  const auto found = map.find(dbEntityType);
  return found == map.end() ? nullptr : found->second;
}

int64_t KRDBEntity::entityTypeForDBEntityType(uint8_t dbEntityType) {
  const KRDBEntityClass* entityClass = entityClassForDBEntityType(dbEntityType);
  return entityClass ? entityClass->entityType : KRDBEntityTypeNone;
}

KRDBEntityPtr KRDBEntity::entityWithDBEntity(const Record& record) {
  if (!record) return nullptr;
  const KRDBEntityClass* entityClass = entityClassForDBEntityType(record->type());
  if (!entityClass) {
    KRLog(KRLogLevelError, "Error: no entity class is registered for record type %d", record->type());
    return nullptr;
  }
  return entityClass->initWithDBEntity(record);
}

uint8_t KRDBEntity::dbEntityType() {
  KRLog(KRLogLevelMissingOverride, "Error: %@ should be overrided in subclass", "dbEntityType");
  KRException::raise(KRException::NSInvalidArgumentException,
                     "+[KRDBEntity dbEntityType]: unrecognized selector");
}

int64_t KRDBEntity::entityType() {
  KRLog(KRLogLevelMissingOverride, "Error: %@ should be overrided in subclass", "entityType");
  KRException::raise(KRException::NSInvalidArgumentException,
                     "+[KRDBEntity entityType]: unrecognized selector");
}

const std::vector<std::string>& KRDBEntity::necessaryLinkedEntitiesKeys() {
  static const std::vector<std::string> none;
  return none;
}

// ---- Record

bool KRDBEntity::storeInfoFromDBentity(const Record& record) {
  if (!record) return false;
  markedToDelete_ = record->marked_to_delete();
  return true;
}

bool KRDBEntity::updateWithDBEntity(const Record& record) { return updateWithDBEntity(record, false); }

bool KRDBEntity::updateWithDBEntity(const Record& record, bool silent) {
  if (!record || record->type() != dbentity_->type() || record->id() != dbentity_->id()) return false;
  if (!silent) willChange({});
  dbentity_->set_column_values(record->column_values());
  const bool stored = storeInfoFromDBentity(record);
  if (!silent) didChange({});
  return stored;
}

KRDBEntityPtr KRDBEntity::copyEntity() const { return entityWithDBEntity(dbentity_->clone()); }

void KRDBEntity::awakeFromFetch() {}

// ---- Changes

void KRDBEntity::willChange(const KRDictionary& info) { notifyEntityWillChange(info); }

void KRDBEntity::didChange(const KRDictionary& info) {
  const KRValue& marker = info.objectForKey(kKRDBEntityDidNotChange);
  if (!marker.number().boolValue()) {
    dbEntityChanged_ = true;
    resetValidationRecord();
  }
  notifyEntityDidChange(marker.isNil() ? info
                                       : info.dictionaryByRemovingObjectForKey(kKRDBEntityDidNotChange));
}

void KRDBEntity::didChangeWithoutRecord() {
  // Such a change only informs the observers: without any, there is nothing to build.
  if (hasListeners()) didChange({{kKRDBEntityDidNotChange, true}});
}

void KRDBEntity::notifyEntityWillChange(const KRDictionary& info) {
  notifyObserversWithSelector(&KRDBEntityObserver::entityWillChange, self(), info);
}

void KRDBEntity::notifyEntityDidChange(const KRDictionary& info) {
  notifyObserversWithSelector(&KRDBEntityObserver::entityDidChange, self(), info);
}

void KRDBEntity::setValidationRecord(const Record& record) {
  if (record == validationRecord()) return;
  if (record || rare_) rare().validationRecord = record;
  if (record) notifyObserversWithSelector(&KRDBEntityObserver::validationRecordDidSet, self());
}

void KRDBEntity::resetValidationRecord() { setValidationRecord(nullptr); }

void KRDBEntity::setMarkedToDelete(bool markedToDelete) {
  if (markedToDelete == markedToDelete_) return;
  willChange({});
  markedToDelete_ = markedToDelete;
  dbentity_->set_marked_to_delete(markedToDelete);
  didChange({{kKRDBEntityMarkedToDelete, markedToDelete}});
}

void KRDBEntity::resetToDefaultState() {
  setMarkedToDelete(false);
  if (const auto& alias = favoriteAliasPrimitive()) alias->resetToDefaultState();
}

void KRDBEntity::reset() { setFavoriteAliasPrimitive(nullptr); }

// ---- Necessary linked entities

bool KRDBEntity::needFetchNecessaryEntities() const {
  for (const auto& key : linkedEntitiesKeys()) {
    if (!necessaryLinkedEntity(key)) return true;
  }
  return false;
}

std::shared_ptr<KRDBEntity> KRDBEntity::necessaryLinkedEntity(const std::string& key) const {
  return valueForKey(key).objectAs<KRDBEntity>();
}

KRDictionary KRDBEntity::necessaryLinkedEntitiesDictionary() const {
  std::vector<KRDictionary::Entry> entries;
  for (const auto& key : linkedEntitiesKeys()) {
    KRValue value = valueForKey(key);
    if (!value.isNil()) entries.emplace_back(key, std::move(value));
  }
  return KRDictionary(entries);
}

void KRDBEntity::updateNecessaryEntityForKey(const std::string& key, const KRDBEntityPtr& entity) {
  const auto& keys = linkedEntitiesKeys();
  if (std::find(keys.begin(), keys.end(), key) != keys.end()) setValueForKey(KRValue(entity), key);
}

void KRDBEntity::pushCompletionFetchingNecessaryEntities(Completion completion) {
  necessaryEntitiesFetchingCompletions().push_back(std::move(completion));
}

std::vector<KRDBEntity::Completion>& KRDBEntity::necessaryEntitiesFetchingCompletions() {
  if (!necessaryEntitiesFetchingCompletions_) {
    necessaryEntitiesFetchingCompletions_ = std::make_unique<std::vector<Completion>>();
  }
  return *necessaryEntitiesFetchingCompletions_;
}

void KRDBEntity::setNecesserryEntitiesToFetchCount(uint64_t count) {
  if (count == necesserryEntitiesToFetchCount_) return;
  necesserryEntitiesToFetchCount_ = count;
  if (count != 0 || !necessaryEntitiesFetchingCompletions_) return;
  const auto completions = std::move(necessaryEntitiesFetchingCompletions_);
  for (const auto& completion : *completions) {
    if (completion) completion();
  }
}

// ---- Deletion keys

KRString KRDBEntity::markedToDeleteHashKey() const { return {}; }

namespace {

// The file path of the exif reader's url (file URLs are absolute paths here), or nil.
KRString exifReaderFilePath(const KRDictionary& entityInfo) {
  const auto reader = entityInfo.objectForKey(kImageInfoExifReader).object();
  if (!reader) return {};
  try {
    return reader->valueForKey(kURLKey).string();
  } catch (const KRException&) {
    return {};
  }
}

KRString hashKey(int64_t entityType, const KRString& path) {
  return path ? KRString(std::to_string(entityType) + "-" + path.str()) : KRString();
}

}  // namespace

KRString KRDBEntity::markedToDeleteHashKeyForEntityType(int64_t entityType, const KRDictionary& entityInfo) {
  switch (entityType) {
    case KRDBEntityTypeImage:
      return hashKey(entityType, exifReaderFilePath(entityInfo));
    case KRDBEntityTypeReferencedFolder:
      return hashKey(entityType, entityInfo.objectForKey(kPathInfoPath).string());
    default:
      return {};
  }
}

// ---- Annotations and key-value coding

std::unordered_map<std::string, KRValue>& KRDBEntity::additionalInfo() { return rare().additionalInfo; }

KRValue KRDBEntity::valueForKey(const std::string& key) const {
  if (key == "markedToDelete") return markedToDelete_;
  if (key == "dbEntityChanged") return dbEntityChanged_;
  if (key == "entityID") return entityID_;
  if (key == "favoriteAlias" || key == "favoriteAliasPrimitive") return favoriteAliasPrimitive();
  if (key == "necesserryEntitiesToFetchCount") return necesserryEntitiesToFetchCount_;
  return KRAbstractModel::valueForKey(key);
}

void KRDBEntity::setValueForKey(const KRValue& value, const std::string& key) {
  if (key == "markedToDelete") return setMarkedToDelete(value.number().boolValue());
  if (key == "favoriteAliasPrimitive")
    return setFavoriteAliasPrimitive(value.objectAs<KRDBEntityFavoriteAlias>());
  if (key == "necesserryEntitiesToFetchCount") {
    return setNecesserryEntitiesToFetchCount(value.number().unsignedLongLongValue());
  }
  KRAbstractModel::setValueForKey(value, key);
}
