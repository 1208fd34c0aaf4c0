#pragma once

#include <cstdint>
#include <initializer_list>
#include <memory>
#include <utility>
#include <vector>

class KRValue;
class KRArray;

// Immutable, nullable map from values to values. A later entry for an equal key replaces the
// earlier one. Iteration follows first insertion order.
class KRDictionary {
 public:
  using Entry = std::pair<KRValue, KRValue>;

  KRDictionary() = default;  // nil
  KRDictionary(const std::vector<Entry>& entries);
  KRDictionary(std::initializer_list<Entry> entries);
  static KRDictionary dictionary();  // empty, not nil

  bool isNil() const { return !storage_; }
  explicit operator bool() const { return storage_ != nullptr; }
  size_t count() const;
  // The entries in insertion order; empty for nil.
  const std::vector<Entry>& entries() const;
  // The value for the key, or nil.
  const KRValue& objectForKey(const KRValue& key) const;
  KRArray allKeys() const;
  KRArray allValues() const;
  // A copy with the given entries added over the receiver's.
  KRDictionary dictionaryByAddingEntriesFromDictionary(const KRDictionary& other) const;
  KRDictionary dictionaryBySettingObject(const KRValue& value, const KRValue& key) const;
  KRDictionary dictionaryByRemovingObjectForKey(const KRValue& key) const;

  bool operator==(const KRDictionary& other) const;
  uint64_t hash() const;
  friend bool identical(const KRDictionary& a, const KRDictionary& b) { return a.storage_ == b.storage_; }

 private:
  struct Storage;
  std::shared_ptr<Storage> mutableCopy() const;
  explicit KRDictionary(std::shared_ptr<const Storage> storage) : storage_(std::move(storage)) {}
  std::shared_ptr<const Storage> storage_;
};

#include "KRFoundation/KRValue.hpp"
