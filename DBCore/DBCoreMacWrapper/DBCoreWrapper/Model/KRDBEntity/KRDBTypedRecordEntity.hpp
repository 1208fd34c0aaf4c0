#pragma once

#include <memory>
#include <string>
#include <type_traits>
#include <utility>

#include "Model/KRDBEntity/KRDBEntity.hpp"
#include "Model/KRDBEntity/KRDBKeyAccessors.hpp"
#include "Support/KRDBRecordFieldConversion.hpp"

// The common layer of the entities over one engine record class (TypedRecord): the typed view of the held
// record, the setter protocol over a record field given as a member pointer (strings and dates compared by
// identity, every other value by value), key-value coding from a table of accessors, and lazily asked
// weak relations. Used on the entity's context's thread, like every entity.
template <class TypedRecord>
class KRDBTypedRecordEntity : public KRDBEntity {
 protected:
  using KRDBEntity::KRDBEntity;

  // The held record as its own class; empty for a record of another class.
  std::shared_ptr<TypedRecord> typedRecord() const {
    return std::dynamic_pointer_cast<TypedRecord>(dbentity());
  }

  // The setter protocol for a cached field whose record field is recordField.
  template <class T, class Field>
  void setRecordField(T& field, T value, const char* changeKey, Field TypedRecord::*recordField) {
    const auto write = [this, recordField](const T& stored) {
      if (const auto record = typedRecord())
        (*record).*recordField = KRDBRecordFieldConversion::toRecord<Field>(stored);
    };
    if constexpr (std::is_same_v<T, KRString> || std::is_same_v<T, KRDate>) {
      setRecordObject(field, std::move(value), changeKey, write);
    } else {
      setRecordValue(field, std::move(value), changeKey, write);
    }
  }

  // Reads a record field into its cached field.
  template <class T, class Field>
  static void load(T& field, const TypedRecord& record, Field TypedRecord::*recordField) {
    field = KRDBRecordFieldConversion::fromRecord<T>(record.*recordField);
  }

  // The related entity held in the weak cache, else the one the context answers (kept in the cache); nil
  // without a context.
  template <class Related, class Self, class Query>
  std::shared_ptr<Related> lazyRelation(std::weak_ptr<Related>& cache, Query query) {
    if (auto related = cache.lock()) return related;
    const auto context = this->context();
    if (!context) return nullptr;
    auto related = ((*context).*query)(std::static_pointer_cast<Self>(self()));
    cache = related;
    return related;
  }

  // Key-value coding through the class's accessor table, falling back to the base's keys.
  template <class Self>
  KRValue valueForTableKey(const KRDBKeyAccessors<Self>& accessors, const std::string& key) const {
    const auto found = accessors.find(key);
    if (found == accessors.end()) return KRDBEntity::valueForKey(key);
    return found->second.get(static_cast<const Self&>(*this));
  }
  template <class Self>
  void setValueForTableKey(const KRDBKeyAccessors<Self>& accessors, const KRValue& value,
                           const std::string& key) {
    const auto found = accessors.find(key);
    if (found == accessors.end() || !found->second.set) return KRDBEntity::setValueForKey(value, key);
    found->second.set(static_cast<Self&>(*this), value);
  }
};
