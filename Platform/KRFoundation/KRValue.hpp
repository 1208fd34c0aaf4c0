#pragma once

#include <concepts>
#include <cstdint>
#include <memory>
#include <string>
#include <variant>

#include "KRFoundation/KRArray.hpp"
#include "KRFoundation/KRDate.hpp"
#include "KRFoundation/KRDictionary.hpp"
#include "KRFoundation/KRNumber.hpp"
#include "KRFoundation/KRObject.hpp"
#include "KRFoundation/KRSet.hpp"
#include "KRFoundation/KRString.hpp"

// The null marker that collections hold where a value is absent (nil itself cannot be stored).
struct KRNull {
  bool operator==(const KRNull&) const = default;
};

// A dynamic value: nil, null, number, string, date, array, set, dictionary or object.
// A nil handle of any kind becomes the nil value.
class KRValue {
 public:
  enum class Type { Nil, Null, Number, String, Date, Array, Set, Dictionary, Object };

  KRValue() = default;
  KRValue(std::nullptr_t) {}
  KRValue(KRNull) : storage_(KRNull{}) {}
  KRValue(bool value) : KRValue(KRNumber::numberWithBool(value)) {}
  template <std::integral T>
  requires(!std::same_as<T, bool>) KRValue(T value)
      : KRValue(std::is_signed_v<T>
                    ? KRNumber::numberWithLongLong(static_cast<long long>(value))
                    : KRNumber::numberWithUnsignedLongLong(static_cast<unsigned long long>(value))) {}
  KRValue(double value) : KRValue(KRNumber::numberWithDouble(value)) {}
  KRValue(const char* text) : KRValue(KRString(text)) {}
  KRValue(std::string text) : KRValue(KRString(std::move(text))) {}
  KRValue(KRNumber number);
  KRValue(KRString string);
  KRValue(KRDate date);
  KRValue(KRArray array);
  KRValue(KRSet set);
  KRValue(KRDictionary dictionary);
  KRValue(std::shared_ptr<KRObject> object);
  template <class T>
  requires std::derived_from<T, KRObject> KRValue(std::shared_ptr<T> object)
      : KRValue(std::static_pointer_cast<KRObject>(std::move(object))) {}

  static KRValue null() { return KRValue(KRNull{}); }

  Type type() const { return static_cast<Type>(storage_.index()); }
  bool isNil() const { return type() == Type::Nil; }
  bool isNull() const { return type() == Type::Null; }
  bool isNumber() const { return type() == Type::Number; }
  bool isString() const { return type() == Type::String; }

  // Typed views: the handle, or a nil handle when the value is of another type.
  KRNumber number() const;
  KRString string() const;
  KRDate date() const;
  KRArray array() const;
  KRSet set() const;
  KRDictionary dictionary() const;
  std::shared_ptr<KRObject> object() const;
  template <class T>
  std::shared_ptr<T> objectAs() const {
    return std::dynamic_pointer_cast<T>(object());
  }

  // Value equality (objects by their isEqual); `identical` compares the underlying objects.
  bool operator==(const KRValue& other) const;
  uint64_t hash() const;
  friend bool identical(const KRValue& a, const KRValue& b);
  std::string description() const;

  // Key-value coding: dictionaries answer their entries, arrays and sets the collection of their
  // elements' values, dates "timeIntervalSince1970", objects their own keys.
  KRValue valueForKey(const std::string& key) const;
  KRValue valueForKeyPath(const std::string& keyPath) const;

 private:
  KRValue mappedArray(const std::string& key) const;
  KRValue mappedSet(const std::string& key) const;

  using Storage = std::variant<std::monostate, KRNull, KRNumber, KRString, KRDate, KRArray, KRSet,
                               KRDictionary, std::shared_ptr<KRObject>>;
  Storage storage_;
};

struct KRValueHash {
  size_t operator()(const KRValue& value) const { return static_cast<size_t>(value.hash()); }
};
