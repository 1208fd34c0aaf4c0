#pragma once

#include <cmath>
#include <cstdint>
#include <functional>
#include <limits>
#include <memory>
#include <string>
#include <type_traits>
#include <unordered_map>
#include <utility>

#include "Model/KRDBEntity/KRDBEntity.hpp"
#include "Support/KRDBRecordConversions.hpp"

// How a cached value crosses into a record field of another type: strings as wide strings, dates as whole
// seconds, floats into integer fields truncated toward zero (NaN as 0, saturating at the field's range),
// 64-bit values into 32-bit fields keeping their low 32 bits. Stateless; any thread.
struct KRDBRecordFieldConversion {
  template <class Field, class T>
  static Field toRecord(const T& value) {
    if constexpr (std::is_same_v<T, KRString>) {
      return KRDBRecordConversions::wideString(value);
    } else if constexpr (std::is_same_v<T, KRDate>) {
      return KRDBRecordConversions::seconds(value);
    } else if constexpr (std::is_floating_point_v<T> && std::is_integral_v<Field>) {
      return truncated<Field>(value);
    } else if constexpr (std::is_integral_v<T> && std::is_integral_v<Field> && sizeof(Field) < sizeof(T)) {
      return static_cast<Field>(static_cast<std::make_unsigned_t<Field>>(value));
    } else {
      return static_cast<Field>(value);
    }
  }

  template <class T, class Field>
  static T fromRecord(const Field& field) {
    if constexpr (std::is_same_v<T, KRString>) {
      return KRDBRecordConversions::string(field);
    } else if constexpr (std::is_same_v<T, KRDate>) {
      return KRDBRecordConversions::date(field);
    } else {
      return static_cast<T>(field);
    }
  }

 private:
  template <class Field, class T>
  static Field truncated(T value) {
    if (std::isnan(value)) return 0;
    if (value <= static_cast<T>(std::numeric_limits<Field>::min())) return std::numeric_limits<Field>::min();
    if (value >= static_cast<T>(std::numeric_limits<Field>::max())) return std::numeric_limits<Field>::max();
    return static_cast<Field>(value);
  }
};

// Key-value access to one property of an entity class: a getter and, unless read-only, a setter. The
// tables are built once and only read; they are used on the entity's thread.
template <class Self>
struct KRDBKeyAccessor {
  std::function<KRValue(const Self&)> get;
  std::function<void(Self&, const KRValue&)> set;
};
template <class Self>
using KRDBKeyAccessors = std::unordered_map<std::string, KRDBKeyAccessor<Self>>;

// The value of a key-value argument as the type a setter takes.
template <class T>
T krdbValueAs(const KRValue& value) {
  if constexpr (std::is_same_v<T, bool>) {
    return value.number().boolValue();
  } else if constexpr (std::is_floating_point_v<T>) {
    return static_cast<T>(value.number().doubleValue());
  } else if constexpr (std::is_integral_v<T> && std::is_unsigned_v<T>) {
    return static_cast<T>(value.number().unsignedLongLongValue());
  } else if constexpr (std::is_integral_v<T>) {
    return static_cast<T>(value.number().longLongValue());
  } else if constexpr (std::is_same_v<T, KRString>) {
    return value.string();
  } else if constexpr (std::is_same_v<T, KRDate>) {
    return value.date();
  } else {
    return value.objectAs<typename T::element_type>();
  }
}

template <class Self, class Result>
KRDBKeyAccessor<Self> krdbReadOnlyKey(Result (Self::*getter)() const) {
  return {[getter](const Self& self) { return KRValue((self.*getter)()); }, nullptr};
}

template <class Self, class Result, class Argument>
KRDBKeyAccessor<Self> krdbKey(Result (Self::*getter)() const, void (Self::*setter)(Argument)) {
  auto accessor = krdbReadOnlyKey(getter);
  accessor.set = [setter](Self& self, const KRValue& value) {
    (self.*setter)(krdbValueAs<std::decay_t<Argument>>(value));
  };
  return accessor;
}

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
