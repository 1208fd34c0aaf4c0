#include "KRFoundation/KRArray.hpp"

#include <algorithm>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRHashing.hpp"

KRArray::KRArray(std::vector<KRValue> values)
    : values_(std::make_shared<const std::vector<KRValue>>(std::move(values))) {}

KRArray::KRArray(std::initializer_list<KRValue> values) : KRArray(std::vector<KRValue>(values)) {}

KRArray KRArray::array() { return KRArray(std::vector<KRValue>{}); }

size_t KRArray::count() const { return values_ ? values_->size() : 0; }

const std::vector<KRValue>& KRArray::values() const {
  static const std::vector<KRValue> empty;
  return values_ ? *values_ : empty;
}

const KRValue& KRArray::objectAtIndex(size_t index) const {
  if (index >= count()) {
    KRException::raise(
        KRException::NSRangeException,
        "index " + std::to_string(index) + " beyond bounds [0 .. " + std::to_string(count()) + ")");
  }
  return (*values_)[index];
}

bool KRArray::containsObject(const KRValue& value) const {
  const auto& all = values();
  return std::find(all.begin(), all.end(), value) != all.end();
}

KRArray KRArray::arrayByAddingObject(const KRValue& value) const {
  std::vector<KRValue> copy = values();
  copy.push_back(value);
  return KRArray(std::move(copy));
}

bool KRArray::operator==(const KRArray& other) const {
  if (!values_ || !other.values_) return values_ == other.values_;
  return *values_ == *other.values_;
}

uint64_t KRArray::hash() const {
  uint64_t result = KRHashing::mix(count());
  for (const auto& value : values()) result = KRHashing::combine(result, value.hash());
  return result;
}
