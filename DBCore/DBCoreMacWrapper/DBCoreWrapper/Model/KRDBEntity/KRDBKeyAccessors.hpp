#pragma once

#include <functional>
#include <memory>
#include <string>
#include <type_traits>
#include <unordered_map>

#include "KRFoundation/KRValue.hpp"

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
