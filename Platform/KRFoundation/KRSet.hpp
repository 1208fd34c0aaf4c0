#pragma once

#include <cstdint>
#include <initializer_list>
#include <memory>
#include <vector>

class KRValue;

// Immutable, nullable unordered collection of distinct values. Objects are members by their own
// equality, which is identity unless their class defines otherwise. Iteration follows insertion order.
class KRSet {
 public:
  KRSet() = default;  // nil
  KRSet(const std::vector<KRValue>& values);
  KRSet(std::initializer_list<KRValue> values);
  static KRSet set();  // empty, not nil

  bool isNil() const { return !storage_; }
  explicit operator bool() const { return storage_ != nullptr; }
  size_t count() const;
  // The members in insertion order; empty for nil.
  const std::vector<KRValue>& allObjects() const;
  bool containsObject(const KRValue& value) const;
  KRSet setByAddingObject(const KRValue& value) const;

  bool operator==(const KRSet& other) const;
  uint64_t hash() const;
  friend bool identical(const KRSet& a, const KRSet& b) { return a.storage_ == b.storage_; }

 private:
  struct Storage;
  std::shared_ptr<const Storage> storage_;
};

#include "KRFoundation/KRValue.hpp"
