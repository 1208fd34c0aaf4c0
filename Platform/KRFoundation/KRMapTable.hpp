#pragma once

#include <cstdint>
#include <functional>
#include <unordered_map>
#include <utility>
#include <vector>

// A hash map whose key hashing and equality are functions given by the caller. Keys and values are
// held as given (shared pointers hold strongly). A missing key answers a default-constructed value.
template <class Key, class Value>
class KRMapTable {
 public:
  using HashFunction = std::function<uint64_t(const Key&)>;
  using EqualFunction = std::function<bool(const Key&, const Key&)>;

  KRMapTable(HashFunction hash, EqualFunction equal, size_t capacity = 0)
      : map_(capacity, Hasher{std::move(hash)}, Equality{std::move(equal)}) {}

  Value objectForKey(const Key& key) const {
    const auto found = map_.find(key);
    return found == map_.end() ? Value{} : found->second;
  }
  bool containsKey(const Key& key) const { return map_.find(key) != map_.end(); }
  void setObject(Value value, const Key& key) { map_.insert_or_assign(key, std::move(value)); }
  void removeObjectForKey(const Key& key) { map_.erase(key); }
  void removeAllObjects() { map_.clear(); }
  size_t count() const { return map_.size(); }

  std::vector<Key> allKeys() const {
    return collect([](const auto& entry) { return entry.first; });
  }
  std::vector<Value> allValues() const {
    return collect([](const auto& entry) { return entry.second; });
  }
  // Calls body(key, value) for every entry; the table must not change meanwhile.
  template <class Body>
  void forEach(Body&& body) const {
    for (const auto& [key, value] : map_) body(key, value);
  }

 private:
  struct Hasher {
    HashFunction function;
    size_t operator()(const Key& key) const { return static_cast<size_t>(function(key)); }
  };
  struct Equality {
    EqualFunction function;
    bool operator()(const Key& a, const Key& b) const { return function(a, b); }
  };

  template <class Project>
  auto collect(Project project) const {
    std::vector<std::decay_t<decltype(project(*map_.begin()))>> result;
    result.reserve(map_.size());
    for (const auto& entry : map_) result.push_back(project(entry));
    return result;
  }

  std::unordered_map<Key, Value, Hasher, Equality> map_;
};
