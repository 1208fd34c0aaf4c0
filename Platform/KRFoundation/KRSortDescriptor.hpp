#pragma once

#include <concepts>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "KRFoundation/KRValue.hpp"

// A three-way comparison of two values read at a sort descriptor's key path.
using KRValueComparator = std::function<KRComparisonResult(const KRValue&, const KRValue&)>;

class KRSortDescriptor;
using KRSortDescriptors = std::vector<std::shared_ptr<KRSortDescriptor>>;

// Orders objects by the value at a key path, ascending or descending.
//
// The comparison is one of:
// - "compare:" (the default), the natural order: numbers by value whatever their kind, strings by code
//   point, dates by time, arrays element by element (a prefix first). A NaN number sorts before every
//   other number. Values of different types order by type: nil, null, numbers, strings, dates, arrays,
//   sets, dictionaries, objects; so nil sorts before everything else. Two nils, two nulls, two sets,
//   two dictionaries or two objects have no order between them and compare same.
// - "localizedCompare:", "caseInsensitiveCompare:", "localizedStandardCompare:": that KRString ordering
//   between two strings; any other pair falls back to the natural order.
// - A C++ comparator, given the two key-path values (nil included).
// A descending descriptor reverses the answer. Immutable after construction: compareObject may run on
// several threads at once (a C++ comparator must allow that itself). Descriptor lists hold no nil.
class KRSortDescriptor : public KRObject {
 public:
  static std::shared_ptr<KRSortDescriptor> sortDescriptorWithKey(const std::string& keyPath, bool ascending);
  // Raises NSInvalidArgumentException for a selector name other than the four above.
  static std::shared_ptr<KRSortDescriptor> sortDescriptorWithKey(const std::string& keyPath, bool ascending,
                                                                 const std::string& selectorName);
  // Raises NSInvalidArgumentException for an empty comparator.
  static std::shared_ptr<KRSortDescriptor> sortDescriptorWithKey(const std::string& keyPath, bool ascending,
                                                                 KRValueComparator comparator);

  const std::string& key() const { return keyPath_; }
  bool ascending() const { return ascending_; }
  // The named comparison; empty for a descriptor with a C++ comparator.
  const std::string& selectorName() const { return selectorName_; }
  // The same key and comparison in the other direction.
  std::shared_ptr<KRSortDescriptor> reversedSortDescriptor() const;

  // Compares the values of the two objects at the key path. An unknown key raises
  // NSUnknownKeyException, as key-value coding does.
  KRComparisonResult compareObject(const KRValue& a, const KRValue& b) const;
  // The value compared for an object: the object itself for an empty key path, "SELF" or "self",
  // otherwise its value at the key path.
  KRValue keyValueOfObject(const KRValue& object) const;
  // Compares two values already read at the key path, in the descriptor's direction.
  KRComparisonResult compareKeyValues(const KRValue& a, const KRValue& b) const;

  // The first answer other than same of the descriptors in order; same if all agree or there are none.
  static KRComparisonResult compareWithDescriptors(const KRValue& a, const KRValue& b,
                                                   const KRSortDescriptors& descriptors);
  // Stable sort: the first descriptor decides, later ones break ties, and values that compare same
  // under every descriptor keep their input order. Each key path is read once per value.
  static std::vector<KRValue> sortedArrayUsingDescriptors(const std::vector<KRValue>& values,
                                                          const KRSortDescriptors& descriptors);
  template <std::derived_from<KRObject> T>
  static std::vector<std::shared_ptr<T>> sortedArrayUsingDescriptors(
      const std::vector<std::shared_ptr<T>>& objects, const KRSortDescriptors& descriptors) {
    const std::vector<KRValue> values(objects.begin(), objects.end());
    return inOrder(objects, sortedOrder(values, descriptors));
  }

  // "(key, ascending, compare:)"
  std::string description() const override;
  // Equal when key, direction and named comparison are equal; a descriptor with a C++ comparator is
  // equal only to itself.
  bool isEqual(const std::shared_ptr<const KRObject>& other) const override;
  uint64_t hash() const override;

 private:
  using StringOrdering = KRComparisonResult (KRString::*)(const KRString&) const;

  KRSortDescriptor(std::string keyPath, bool ascending, std::string selectorName,
                   StringOrdering stringOrdering, KRValueComparator comparator);

  static StringOrdering stringOrderingNamed(const std::string& selectorName);
  static KRComparisonResult naturalOrder(const KRValue& a, const KRValue& b, StringOrdering stringOrdering);
  static KRComparisonResult orderOfNumbers(const KRNumber& a, const KRNumber& b);
  static KRComparisonResult orderOfArrays(const KRArray& a, const KRArray& b, StringOrdering stringOrdering);
  // The positions of the values in sorted order.
  static std::vector<size_t> sortedOrder(const std::vector<KRValue>& values,
                                         const KRSortDescriptors& descriptors);
  template <class Item>
  static std::vector<Item> inOrder(const std::vector<Item>& items, const std::vector<size_t>& order) {
    std::vector<Item> ordered;
    ordered.reserve(order.size());
    for (size_t position : order) ordered.push_back(items[position]);
    return ordered;
  }

  std::string keyPath_;
  bool ascending_;
  std::string selectorName_;
  StringOrdering stringOrdering_;
  KRValueComparator comparator_;
};
