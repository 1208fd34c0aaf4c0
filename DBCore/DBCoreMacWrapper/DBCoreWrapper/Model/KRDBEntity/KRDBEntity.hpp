#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

#include "KRClasses/KRAbstractModel.hpp"
#include "KRFoundation/KRValue.hpp"
#include "Model/KRDBEntity/KRDBEntityClass.hpp"
#include "Model/KRDBEntity/KRDBEntityContext.hpp"
#include "Model/KRDBEntity/KRDBEntityID.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"

namespace dbcore {
class DBEntity;
}

// In a change info: true means that the record itself did not change (a relation or a cache did).
extern const char* const kKRDBEntityDidNotChange;
// The change key posted when the marked-to-delete flag changes.
extern const char* const kKRDBEntityMarkedToDelete;

// The abstract base of every entity: wraps one engine record shared with the catalog, keeps its identity,
// tracks unsaved changes, keeps the validation record that fetch requests test, and tells its observers
// (KRDBEntityObserver) before and after every change. The class side keeps the process-wide registry from
// record type to entity class. An entity is used on its context's thread; it never locks.
class KRDBEntity : public KRAbstractModel {
 public:
  using Record = std::shared_ptr<dbcore::DBEntity>;
  using Completion = std::function<void()>;
  using ClassMap = std::unordered_map<uint8_t, const KRDBEntityClass*>;

  // ---- Registry of entity classes by record type
  // Stores the class under its record type, replacing an earlier one; a class without one is ignored.
  static void registerEntityClass(const KRDBEntityClass& entityClass);
  // The registry, made empty on first use.
  static ClassMap& dbEntityTypeToClassMap();
  static const KRDBEntityClass* entityClassForDBEntityType(uint8_t dbEntityType);
  // The entity type of the class registered for the record type, or KRDBEntityTypeNone.
  static int64_t entityTypeForDBEntityType(uint8_t dbEntityType);
  // A new entity of the class registered for the record's type. Nil for no record; nil and a logged
  // error for a record type that has no class.
  static std::shared_ptr<KRDBEntity> entityWithDBEntity(const Record& record);
  // The abstract class has no numbers: asking it is a programming error (logged, then raised).
  static uint8_t dbEntityType();
  static int64_t entityType();
  // The properties that must be present before an entity is complete: none here.
  static const std::vector<std::string>& necessaryLinkedEntitiesKeys();

  // The concrete class of this entity.
  virtual const KRDBEntityClass& entityClass() const = 0;

  // ---- Record
  const KRDBEntityIDPtr& entityID() const { return entityID_; }
  Record dbentity() const { return dbentity_; }
  Record validationRecord() const { return rare_ ? rare_->validationRecord : nullptr; }
  // Refreshes the cached values from the record; false when the record does not suit the class.
  virtual bool storeInfoFromDBentity(const Record& record);
  // Takes the values of a fresher record of the same entity into the held record; false, changing
  // nothing, for a record of another type or id. A silent update posts nothing and keeps the
  // changed flag and the validation record.
  bool updateWithDBEntity(const Record& record);
  bool updateWithDBEntity(const Record& record, bool silent);
  // A new entity over a deep copy of the record, without context, favorite alias or validation record.
  std::shared_ptr<KRDBEntity> copyEntity() const;
  // Called after the entity was built from a fetch.
  virtual void awakeFromFetch();

  // ---- Changes
  void willChange(const KRDictionary& info);
  // Marks the entity changed (unless the info says the record did not change) and notifies the
  // observers with the info less the kKRDBEntityDidNotChange marker.
  void didChange(const KRDictionary& info);
  void setValidationRecord(const Record& record);
  void resetValidationRecord();
  bool isDbEntityChanged() const { return dbEntityChanged_; }
  void setDbEntityChanged(bool changed) { dbEntityChanged_ = changed; }
  bool isMarkedToDelete() const { return markedToDelete_; }
  void setMarkedToDelete(bool markedToDelete);
  // Unmarks the entity (and its favorite alias).
  virtual void resetToDefaultState();
  // Drops cached relations without notification.
  virtual void reset();

  // ---- Necessary linked entities
  bool needFetchNecessaryEntities() const;
  KRDictionary necessaryLinkedEntitiesDictionary() const;
  // The entity held under one of the necessary keys, or nil. Subclasses answer their own keys directly
  // rather than through key-value coding: preparing a million images asks it several times each.
  virtual std::shared_ptr<KRDBEntity> necessaryLinkedEntity(const std::string& key) const;
  // Sets the property by key when it is one of the necessary keys.
  virtual void updateNecessaryEntityForKey(const std::string& key, const std::shared_ptr<KRDBEntity>& entity);
  void pushCompletionFetchingNecessaryEntities(Completion completion);
  std::vector<Completion>& necessaryEntitiesFetchingCompletions();
  uint64_t necesserryEntitiesToFetchCount() const { return necesserryEntitiesToFetchCount_; }
  // Going to 0 calls the queued completions once, in order, and drops them.
  void setNecesserryEntitiesToFetchCount(uint64_t count);

  // ---- Favorite alias
  const std::shared_ptr<KRDBEntityFavoriteAlias>& favoriteAlias() const { return favoriteAliasPrimitive(); }
  const std::shared_ptr<KRDBEntityFavoriteAlias>& favoriteAliasPrimitive() const;
  void setFavoriteAliasPrimitive(std::shared_ptr<KRDBEntityFavoriteAlias> alias);
  // Asks the context for the alias when there is none yet and points the alias back at this entity.
  void createFavoriteAliasIfNeeded();

  // ---- Deletion keys: the entity's kind and location, or nil
  virtual KRString markedToDeleteHashKey() const;
  static KRString markedToDeleteHashKeyForEntityType(int64_t entityType, const KRDictionary& entityInfo);

  // ---- Context and annotations
  std::shared_ptr<KRDBEntityContext> context() const { return context_.lock(); }
  void setContext(const std::shared_ptr<KRDBEntityContext>& context) { context_ = context; }
  std::unordered_map<std::string, KRValue>& additionalInfo();

  // ---- Key-value coding of the base properties
  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;

 protected:
  // Takes the record's identity and marked-to-delete flag.
  explicit KRDBEntity(Record record);

  // The subclasses' store hook: the base's, then the checked downcast, then the typed hook.
  template <class TypedRecord, class Self>
  bool storeInfoWithHook(const Record& record, bool (Self::*hook)(const std::shared_ptr<TypedRecord>&)) {
    if (!KRDBEntity::storeInfoFromDBentity(record)) return false;
    const auto typed = std::dynamic_pointer_cast<TypedRecord>(record);
    return typed && (static_cast<Self*>(this)->*hook)(typed);
  }
  // The setter protocol of a field that lives in the record: nothing for an equal value; otherwise
  // will-change, store, write the record, did-change with {changeKey: true}. setRecordValue compares by
  // value, setRecordObject by object identity (an equal but distinct string, date or collection counts as a
  // change).
  template <class T, class Write>
  void setRecordValue(T& field, T value, const char* changeKey, Write&& writeRecord) {
    if (field == value) return;
    changeRecordField(field, std::move(value), changeKey, writeRecord);
  }
  template <class T, class Write>
  void setRecordObject(T& field, T value, const char* changeKey, Write&& writeRecord) {
    if (identical(field, value)) return;
    changeRecordField(field, std::move(value), changeKey, writeRecord);
  }
  // Posts a change of a relation or cache: {kKRDBEntityDidNotChange: true}.
  void didChangeWithoutRecord();
  std::shared_ptr<KRDBEntity> self() { return std::static_pointer_cast<KRDBEntity>(shared_from_this()); }

 private:
  template <class T, class Write>
  void changeRecordField(T& field, T value, const char* changeKey, Write& writeRecord) {
    willChange({});
    field = std::move(value);
    writeRecord(field);
    didChange({{changeKey, true}});
  }
  const std::vector<std::string>& linkedEntitiesKeys() const {
    return entityClass().necessaryLinkedEntitiesKeys();
  }
  void notifyEntityWillChange(const KRDictionary& info);
  void notifyEntityDidChange(const KRDictionary& info);

  // What few entities carry, kept apart so that the millions of others do not pay for it: the
  // favoriteAlias, the validationRecord and the additionalInfo annotations.
  struct Rare {
    std::shared_ptr<KRDBEntityFavoriteAlias> favoriteAlias;
    Record validationRecord;
    std::unordered_map<std::string, KRValue> additionalInfo;
  };
  Rare& rare();

  KRDBEntityIDPtr entityID_;
  Record dbentity_;
  std::unique_ptr<Rare> rare_;
  std::unique_ptr<std::vector<Completion>> necessaryEntitiesFetchingCompletions_;
  uint64_t necesserryEntitiesToFetchCount_ = 0;
  std::weak_ptr<KRDBEntityContext> context_;
  bool markedToDelete_ = false;
  bool dbEntityChanged_ = false;
};

using KRDBEntityPtr = std::shared_ptr<KRDBEntity>;
