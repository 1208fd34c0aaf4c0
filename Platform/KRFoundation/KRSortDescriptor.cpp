#include "KRFoundation/KRSortDescriptor.hpp"

#include <algorithm>
#include <array>
#include <cmath>
#include <numeric>
#include <utility>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRHashing.hpp"

namespace {

// The order of values of different types, first to last.
constexpr std::array kTypeOrder = {KRValue::Type::Nil,    KRValue::Type::Null,       KRValue::Type::Number,
                                   KRValue::Type::String, KRValue::Type::Date,       KRValue::Type::Array,
                                   KRValue::Type::Set,    KRValue::Type::Dictionary, KRValue::Type::Object};

size_t typeRank(KRValue::Type type) {
  return static_cast<size_t>(std::find(kTypeOrder.begin(), kTypeOrder.end(), type) - kTypeOrder.begin());
}

template <class T>
KRComparisonResult orderOf(const T& a, const T& b) {
  if (a < b) return KROrderedAscending;
  return b < a ? KROrderedDescending : KROrderedSame;
}

bool isSelfKeyPath(const std::string& keyPath) {
  return keyPath.empty() || keyPath == "SELF" || keyPath == "self";
}

}  // namespace

KRSortDescriptor::KRSortDescriptor(std::string keyPath, bool ascending, std::string selectorName,
                                   StringOrdering stringOrdering, KRValueComparator comparator)
    : keyPath_(std::move(keyPath)),
      ascending_(ascending),
      selectorName_(std::move(selectorName)),
      stringOrdering_(stringOrdering),
      comparator_(std::move(comparator)) {}

std::shared_ptr<KRSortDescriptor> KRSortDescriptor::sortDescriptorWithKey(const std::string& keyPath,
                                                                          bool ascending) {
  return sortDescriptorWithKey(keyPath, ascending, "compare:");
}

std::shared_ptr<KRSortDescriptor> KRSortDescriptor::sortDescriptorWithKey(const std::string& keyPath,
                                                                          bool ascending,
                                                                          const std::string& selectorName) {
  const StringOrdering stringOrdering = stringOrderingNamed(selectorName);
  return std::shared_ptr<KRSortDescriptor>(
      new KRSortDescriptor(keyPath, ascending, selectorName, stringOrdering, {}));
}

std::shared_ptr<KRSortDescriptor> KRSortDescriptor::sortDescriptorWithKey(const std::string& keyPath,
                                                                          bool ascending,
                                                                          KRValueComparator comparator) {
  if (!comparator) {
    KRException::raise(KRException::NSInvalidArgumentException,
                       "KRSortDescriptor: a comparator is required for the key " + keyPath);
  }
  return std::shared_ptr<KRSortDescriptor>(
      new KRSortDescriptor(keyPath, ascending, "", &KRString::compare, std::move(comparator)));
}

KRSortDescriptor::StringOrdering KRSortDescriptor::stringOrderingNamed(const std::string& selectorName) {
  static const std::array<std::pair<const char*, StringOrdering>, 4> orderings = {{
      {"compare:", &KRString::compare},
      {"localizedCompare:", &KRString::localizedCompare},
      {"caseInsensitiveCompare:", &KRString::caseInsensitiveCompare},
      {"localizedStandardCompare:", &KRString::localizedStandardCompare},
  }};
  for (const auto& [name, ordering] : orderings) {
    if (selectorName == name) return ordering;
  }
  KRException::raise(KRException::NSInvalidArgumentException,
                     "KRSortDescriptor: unknown comparison selector \"" + selectorName + "\"");
}

std::shared_ptr<KRSortDescriptor> KRSortDescriptor::reversedSortDescriptor() const {
  return std::shared_ptr<KRSortDescriptor>(
      new KRSortDescriptor(keyPath_, !ascending_, selectorName_, stringOrdering_, comparator_));
}

KRComparisonResult KRSortDescriptor::compareObject(const KRValue& a, const KRValue& b) const {
  return compareKeyValues(keyValueOfObject(a), keyValueOfObject(b));
}

KRValue KRSortDescriptor::keyValueOfObject(const KRValue& object) const {
  if (isSelfKeyPath(keyPath_)) return object;
  return object.valueForKeyPath(keyPath_);
}

KRComparisonResult KRSortDescriptor::compareKeyValues(const KRValue& a, const KRValue& b) const {
  const KRComparisonResult order = comparator_ ? comparator_(a, b) : naturalOrder(a, b, stringOrdering_);
  return ascending_ ? order : static_cast<KRComparisonResult>(-order);
}

KRComparisonResult KRSortDescriptor::naturalOrder(const KRValue& a, const KRValue& b,
                                                  StringOrdering stringOrdering) {
  if (a.type() != b.type()) return orderOf(typeRank(a.type()), typeRank(b.type()));
  switch (a.type()) {
    case KRValue::Type::Number:
      return orderOfNumbers(a.number(), b.number());
    case KRValue::Type::String:
      return (a.string().*stringOrdering)(b.string());
    case KRValue::Type::Date:
      return a.date().compare(b.date());
    case KRValue::Type::Array:
      return orderOfArrays(a.array(), b.array(), stringOrdering);
    default:
      return KROrderedSame;
  }
}

// NaN is placed before every other number so that numbers keep a strict order.
KRComparisonResult KRSortDescriptor::orderOfNumbers(const KRNumber& a, const KRNumber& b) {
  const bool aIsNumber = !std::isnan(a.doubleValue());
  const bool bIsNumber = !std::isnan(b.doubleValue());
  if (!aIsNumber || !bIsNumber) return orderOf(aIsNumber, bIsNumber);
  return a.compare(b);
}

KRComparisonResult KRSortDescriptor::orderOfArrays(const KRArray& a, const KRArray& b,
                                                   StringOrdering stringOrdering) {
  const std::vector<KRValue>& left = a.values();
  const std::vector<KRValue>& right = b.values();
  const size_t common = std::min(left.size(), right.size());
  for (size_t i = 0; i < common; ++i) {
    const KRComparisonResult order = naturalOrder(left[i], right[i], stringOrdering);
    if (order != KROrderedSame) return order;
  }
  return orderOf(left.size(), right.size());
}

KRComparisonResult KRSortDescriptor::compareWithDescriptors(const KRValue& a, const KRValue& b,
                                                            const KRSortDescriptors& descriptors) {
  for (const auto& descriptor : descriptors) {
    const KRComparisonResult order = descriptor->compareObject(a, b);
    if (order != KROrderedSame) return order;
  }
  return KROrderedSame;
}

std::vector<KRValue> KRSortDescriptor::sortedArrayUsingDescriptors(const std::vector<KRValue>& values,
                                                                   const KRSortDescriptors& descriptors) {
  return inOrder(values, sortedOrder(values, descriptors));
}

std::vector<size_t> KRSortDescriptor::sortedOrder(const std::vector<KRValue>& values,
                                                  const KRSortDescriptors& descriptors) {
  // The key-path values are read once, row by row: values[i] has its keys at i * width.
  const size_t width = descriptors.size();
  std::vector<KRValue> keyValues;
  keyValues.reserve(values.size() * width);
  for (const KRValue& value : values) {
    for (const auto& descriptor : descriptors) keyValues.push_back(descriptor->keyValueOfObject(value));
  }
  std::vector<size_t> order(values.size());
  std::iota(order.begin(), order.end(), size_t{0});
  std::stable_sort(order.begin(), order.end(), [&](size_t a, size_t b) {
    for (size_t i = 0; i < width; ++i) {
      const KRComparisonResult result =
          descriptors[i]->compareKeyValues(keyValues[a * width + i], keyValues[b * width + i]);
      if (result != KROrderedSame) return result == KROrderedAscending;
    }
    return false;
  });
  return order;
}

std::string KRSortDescriptor::description() const {
  return "(" + keyPath_ + ", " + (ascending_ ? "ascending" : "descending") + ", " +
         (comparator_ ? "<comparator>" : selectorName_) + ")";
}

bool KRSortDescriptor::isEqual(const std::shared_ptr<const KRObject>& other) const {
  const auto descriptor = std::dynamic_pointer_cast<const KRSortDescriptor>(other);
  if (!descriptor) return false;
  if (comparator_ || descriptor->comparator_) return descriptor.get() == this;
  return keyPath_ == descriptor->keyPath_ && ascending_ == descriptor->ascending_ &&
         selectorName_ == descriptor->selectorName_;
}

uint64_t KRSortDescriptor::hash() const {
  const std::hash<std::string> textHash;
  return KRHashing::combine(KRHashing::combine(textHash(keyPath_), ascending_ ? 1 : 0),
                            textHash(selectorName_));
}
