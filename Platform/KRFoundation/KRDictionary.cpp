#include "KRFoundation/KRDictionary.hpp"

#include <unordered_map>

#include "KRFoundation/KRHashing.hpp"

struct KRDictionary::Storage {
  std::vector<Entry> entries;
  std::unordered_map<KRValue, size_t, KRValueHash> index;

  void set(const KRValue& key, const KRValue& value) {
    const auto [position, inserted] = index.emplace(key, entries.size());
    if (inserted) {
      entries.emplace_back(key, value);
    } else {
      entries[position->second].second = value;
    }
  }

  void remove(const KRValue& key) {
    const auto found = index.find(key);
    if (found == index.end()) return;
    entries.erase(entries.begin() + static_cast<std::ptrdiff_t>(found->second));
    index.clear();
    for (size_t i = 0; i < entries.size(); ++i) index.emplace(entries[i].first, i);
  }
};

KRDictionary::KRDictionary(const std::vector<Entry>& entries) {
  auto storage = std::make_shared<Storage>();
  storage->index.reserve(entries.size());
  for (const auto& [key, value] : entries) storage->set(key, value);
  storage_ = std::move(storage);
}

KRDictionary::KRDictionary(std::initializer_list<Entry> entries)
    : KRDictionary(std::vector<Entry>(entries)) {}

KRDictionary KRDictionary::dictionary() { return KRDictionary(std::vector<Entry>{}); }

size_t KRDictionary::count() const { return storage_ ? storage_->entries.size() : 0; }

const std::vector<KRDictionary::Entry>& KRDictionary::entries() const {
  static const std::vector<Entry> empty;
  return storage_ ? storage_->entries : empty;
}

const KRValue& KRDictionary::objectForKey(const KRValue& key) const {
  static const KRValue nil;
  if (!storage_) return nil;
  const auto found = storage_->index.find(key);
  return found == storage_->index.end() ? nil : storage_->entries[found->second].second;
}

KRArray KRDictionary::allKeys() const {
  std::vector<KRValue> keys;
  keys.reserve(count());
  for (const auto& entry : entries()) keys.push_back(entry.first);
  return KRArray(std::move(keys));
}

KRArray KRDictionary::allValues() const {
  std::vector<KRValue> values;
  values.reserve(count());
  for (const auto& entry : entries()) values.push_back(entry.second);
  return KRArray(std::move(values));
}

KRDictionary KRDictionary::dictionaryByAddingEntriesFromDictionary(const KRDictionary& other) const {
  auto storage = mutableCopy();
  for (const auto& [key, value] : other.entries()) storage->set(key, value);
  return KRDictionary(std::move(storage));
}

KRDictionary KRDictionary::dictionaryBySettingObject(const KRValue& value, const KRValue& key) const {
  auto storage = mutableCopy();
  storage->set(key, value);
  return KRDictionary(std::move(storage));
}

KRDictionary KRDictionary::dictionaryByRemovingObjectForKey(const KRValue& key) const {
  auto storage = mutableCopy();
  storage->remove(key);
  return KRDictionary(std::move(storage));
}

std::shared_ptr<KRDictionary::Storage> KRDictionary::mutableCopy() const {
  return storage_ ? std::make_shared<Storage>(*storage_) : std::make_shared<Storage>();
}

bool KRDictionary::operator==(const KRDictionary& other) const {
  if (!storage_ || !other.storage_) return storage_ == other.storage_;
  if (count() != other.count()) return false;
  for (const auto& [key, value] : storage_->entries) {
    const auto found = other.storage_->index.find(key);
    if (found == other.storage_->index.end() || !(other.storage_->entries[found->second].second == value)) {
      return false;
    }
  }
  return true;
}

uint64_t KRDictionary::hash() const {
  uint64_t sum = 0;
  for (const auto& [key, value] : entries()) sum += KRHashing::combine(key.hash(), value.hash());
  return KRHashing::combine(count(), sum);
}
