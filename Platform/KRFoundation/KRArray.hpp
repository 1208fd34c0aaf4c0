#pragma once

#include <cstdint>
#include <initializer_list>
#include <memory>
#include <vector>

class KRValue;

// Immutable, nullable ordered collection of values.
class KRArray {
 public:
  KRArray() = default;  // nil
  KRArray(std::vector<KRValue> values);
  KRArray(std::initializer_list<KRValue> values);
  static KRArray array();  // empty, not nil

  bool isNil() const { return !values_; }
  explicit operator bool() const { return values_ != nullptr; }
  size_t count() const;
  // The elements; empty for nil.
  const std::vector<KRValue>& values() const;
  const KRValue& objectAtIndex(size_t index) const;  // raises NSRangeException past the end
  bool containsObject(const KRValue& value) const;
  KRArray arrayByAddingObject(const KRValue& value) const;

  bool operator==(const KRArray& other) const;
  uint64_t hash() const;
  friend bool identical(const KRArray& a, const KRArray& b) { return a.values_ == b.values_; }

 private:
  std::shared_ptr<const std::vector<KRValue>> values_;
};

#include "KRFoundation/KRValue.hpp"
