#include "KRFoundation/KRSet.hpp"

#include <unordered_set>

#include "KRFoundation/KRHashing.hpp"

struct KRSet::Storage {
  std::vector<KRValue> members;
  std::unordered_set<KRValue, KRValueHash> index;

  void add(const KRValue& value) {
    if (index.insert(value).second) members.push_back(value);
  }
};

KRSet::KRSet(const std::vector<KRValue>& values) {
  auto storage = std::make_shared<Storage>();
  storage->index.reserve(values.size());
  for (const auto& value : values) storage->add(value);
  storage_ = std::move(storage);
}

KRSet::KRSet(std::initializer_list<KRValue> values) : KRSet(std::vector<KRValue>(values)) {}

KRSet KRSet::set() { return KRSet(std::vector<KRValue>{}); }

size_t KRSet::count() const { return storage_ ? storage_->members.size() : 0; }

const std::vector<KRValue>& KRSet::allObjects() const {
  static const std::vector<KRValue> empty;
  return storage_ ? storage_->members : empty;
}

bool KRSet::containsObject(const KRValue& value) const {
  return storage_ && storage_->index.count(value) > 0;
}

KRSet KRSet::setByAddingObject(const KRValue& value) const {
  auto storage = storage_ ? std::make_shared<Storage>(*storage_) : std::make_shared<Storage>();
  storage->add(value);
  KRSet result;
  result.storage_ = std::move(storage);
  return result;
}

bool KRSet::operator==(const KRSet& other) const {
  if (!storage_ || !other.storage_) return storage_ == other.storage_;
  if (count() != other.count()) return false;
  for (const auto& member : storage_->members) {
    if (!other.containsObject(member)) return false;
  }
  return true;
}

uint64_t KRSet::hash() const {
  // Order-independent: the sum of the members' mixed hashes.
  uint64_t sum = 0;
  for (const auto& member : allObjects()) sum += KRHashing::mix(member.hash());
  return KRHashing::combine(count(), sum);
}
