#pragma once

#include <algorithm>
#include <cstdint>
#include <unordered_map>
#include <utility>
#include <vector>

// A map from database id to value, built once from its entries. Ids that fill at least half of the range
// between the smallest and the largest (record ids of a catalog mostly do) are held in an array indexed by
// id, with no key stored and one bit of presence per slot; other sets of ids go to a hash map. Lookups
// take constant time either way, and the array form holds a million entries in a fraction of the hash
// map's memory. Immutable once built: any thread may read it.
template <class T>
class KRDBIDIndexedMap {
 public:
  using Entry = std::pair<int64_t, T>;

  KRDBIDIndexedMap() = default;
  // Of entries with the same id, the last one wins.
  explicit KRDBIDIndexedMap(std::vector<Entry> entries) {
    if (entries.empty()) return;
    const auto [lowest, highest] = std::minmax_element(
        entries.begin(), entries.end(), [](const Entry& a, const Entry& b) { return a.first < b.first; });
    // The distance in unsigned arithmetic is exact for any two 64-bit ids.
    const uint64_t distance = static_cast<uint64_t>(highest->first) - static_cast<uint64_t>(lowest->first);
    if (distance < 2 * static_cast<uint64_t>(entries.size())) {
      storeDense(entries, lowest->first, distance + 1);
    } else {
      storeSparse(entries);
    }
  }

  // The value under the id, or nullptr.
  const T* find(int64_t id) const {
    if (!dense_.empty()) {
      const uint64_t slot = static_cast<uint64_t>(id) - static_cast<uint64_t>(first_);
      return slot < dense_.size() && present_[slot] ? &dense_[slot] : nullptr;
    }
    const auto found = sparse_.find(id);
    return found == sparse_.end() ? nullptr : &found->second;
  }
  size_t size() const { return size_; }
  bool empty() const { return size_ == 0; }
  // True when the ids are held in the array form.
  bool isDense() const { return !dense_.empty(); }

 private:
  void storeDense(std::vector<Entry>& entries, int64_t first, uint64_t span) {
    first_ = first;
    dense_.resize(span);
    present_.resize(span);
    for (auto& [id, value] : entries) {
      const uint64_t slot = static_cast<uint64_t>(id) - static_cast<uint64_t>(first_);
      size_ += present_[slot] ? 0 : 1;
      present_[slot] = true;
      dense_[slot] = std::move(value);
    }
  }
  void storeSparse(std::vector<Entry>& entries) {
    sparse_.reserve(entries.size());
    for (auto& [id, value] : entries) sparse_.insert_or_assign(id, std::move(value));
    size_ = sparse_.size();
  }

  int64_t first_ = 0;
  std::vector<T> dense_;
  std::vector<bool> present_;
  std::unordered_map<int64_t, T> sparse_;
  size_t size_ = 0;
};
