#include "KRFoundation/KRSortDescriptor.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <thread>

#include "KRFoundation/KRException.hpp"

namespace {

class Photo : public KRObject {
 public:
  Photo(std::string name, int rating, KRDictionary camera)
      : name_(std::move(name)), rating_(rating), camera_(std::move(camera)) {}
  KRValue valueForKey(const std::string& key) const override {
    if (key == "name") return name_;
    if (key == "rating") return rating_;
    if (key == "camera") return camera_;
    return KRObject::valueForKey(key);
  }
  const std::string& name() const { return name_; }

 private:
  std::string name_;
  int rating_;
  KRDictionary camera_;
};

KRDictionary record(const KRValue& name, const KRValue& value) {
  return KRDictionary{{"name", name}, {"value", value}};
}

std::vector<std::string> descriptions(const std::vector<KRValue>& values) {
  std::vector<std::string> texts;
  for (const KRValue& value : values) texts.push_back(value.description());
  return texts;
}

// The names of the records, in order.
std::vector<std::string> names(const std::vector<KRValue>& records) {
  std::vector<std::string> texts;
  for (const KRValue& record : records) texts.push_back(record.valueForKey("name").description());
  return texts;
}

std::vector<KRValue> sortedSelf(const std::vector<KRValue>& values, bool ascending = true,
                                const std::string& selector = "compare:") {
  return KRSortDescriptor::sortedArrayUsingDescriptors(
      values, {KRSortDescriptor::sortDescriptorWithKey("SELF", ascending, selector)});
}

std::string randomLabel(std::mt19937& random) {
  static const std::string letters = "aAbBcC";
  std::string label;
  for (int i = 0; i < 3; ++i) label.push_back(letters[random() % letters.size()]);
  return label;
}

}  // namespace

TEST(KRSortDescriptorTest, FactoryKeepsKeyDirectionAndComparison) {
  const auto descriptor = KRSortDescriptor::sortDescriptorWithKey("rating", false);
  EXPECT_EQ(descriptor->key(), "rating");
  EXPECT_FALSE(descriptor->ascending());
  EXPECT_EQ(descriptor->selectorName(), "compare:");
  EXPECT_EQ(descriptor->description(), "(rating, descending, compare:)");
  const auto named = KRSortDescriptor::sortDescriptorWithKey("name", true, "localizedCompare:");
  EXPECT_EQ(named->selectorName(), "localizedCompare:");
  EXPECT_EQ(named->description(), "(name, ascending, localizedCompare:)");
}

TEST(KRSortDescriptorTest, CompareOrdersNumbersStringsAndDatesNaturally) {
  EXPECT_EQ(descriptions(sortedSelf({KRValue(2.5), KRValue(-1), KRValue(10u), KRValue(true), KRValue(0)})),
            (std::vector<std::string>{"-1", "0", "1", "2.5", "10"}));
  EXPECT_EQ(descriptions(sortedSelf({KRValue("b"), KRValue("B"), KRValue("a"), KRValue("A")})),
            (std::vector<std::string>{"A", "B", "a", "b"}));
  const KRDate early = KRDate::dateWithTimeIntervalSince1970(100);
  const KRDate late = KRDate::dateWithTimeIntervalSince1970(200);
  const auto descriptor = KRSortDescriptor::sortDescriptorWithKey("", true);
  EXPECT_EQ(descriptor->compareObject(early, late), KROrderedAscending);
  EXPECT_EQ(descriptor->compareObject(late, early), KROrderedDescending);
  EXPECT_EQ(descriptor->compareObject(KRValue(3), KRValue(3.0)), KROrderedSame);
}

TEST(KRSortDescriptorTest, NilSortsBeforeEverythingAndLastWhenDescending) {
  const std::vector<KRValue> records = {record("one", 1), KRDictionary{{"name", "none"}}, record("zero", 0)};
  const auto ascending = KRSortDescriptor::sortDescriptorWithKey("value", true);
  EXPECT_EQ(names(KRSortDescriptor::sortedArrayUsingDescriptors(records, {ascending})),
            (std::vector<std::string>{"none", "zero", "one"}));
  EXPECT_EQ(
      names(KRSortDescriptor::sortedArrayUsingDescriptors(records, {ascending->reversedSortDescriptor()})),
      (std::vector<std::string>{"one", "zero", "none"}));
  EXPECT_EQ(ascending->compareObject(KRValue(), KRValue()), KROrderedSame);
}

TEST(KRSortDescriptorTest, ValuesOfDifferentTypesOrderByType) {
  const auto object = std::make_shared<Photo>("p", 1, KRDictionary());
  const std::vector<KRValue> values = {object,
                                       KRDictionary::dictionary(),
                                       KRSet::set(),
                                       KRArray::array(),
                                       KRDate::dateWithTimeIntervalSince1970(0),
                                       KRValue("text"),
                                       KRValue(42),
                                       KRValue::null(),
                                       KRValue()};
  const std::vector<KRValue> sorted = sortedSelf(values);
  std::vector<KRValue::Type> types;
  for (const KRValue& value : sorted) types.push_back(value.type());
  EXPECT_EQ(types, (std::vector<KRValue::Type>{KRValue::Type::Nil, KRValue::Type::Null, KRValue::Type::Number,
                                               KRValue::Type::String, KRValue::Type::Date,
                                               KRValue::Type::Array, KRValue::Type::Set,
                                               KRValue::Type::Dictionary, KRValue::Type::Object}));
}

TEST(KRSortDescriptorTest, NaNSortsBeforeOtherNumbersAndArraysCompareElementwise) {
  EXPECT_EQ(descriptions(sortedSelf({KRValue(1), KRValue(std::nan("")), KRValue(-5)})),
            (std::vector<std::string>{"nan", "-5", "1"}));
  const std::vector<KRValue> arrays = {KRArray{1, 2}, KRArray{1}, KRArray{0, 9}, KRArray{1, 1}};
  EXPECT_EQ(descriptions(sortedSelf(arrays)),
            (std::vector<std::string>{"(0, 9)", "(1)", "(1, 1)", "(1, 2)"}));
}

TEST(KRSortDescriptorTest, NamedStringComparisons) {
  EXPECT_EQ(
      descriptions(sortedSelf({KRValue("b"), KRValue("B"), KRValue("a")}, true, "localizedCompare:"))[0],
      "a");
  EXPECT_EQ(descriptions(sortedSelf({KRValue("file10"), KRValue("File2"), KRValue("file1")}, true,
                                    "localizedStandardCompare:")),
            (std::vector<std::string>{"file1", "File2", "file10"}));
  EXPECT_EQ(
      descriptions(sortedSelf({KRValue("banana"), KRValue("APPLE"), KRValue("apple"), KRValue("Cherry")},
                              true, "caseInsensitiveCompare:")),
      (std::vector<std::string>{"APPLE", "apple", "banana", "Cherry"}));
  EXPECT_EQ(descriptions(sortedSelf({KRValue("file10"), KRValue("file2")}, true, "compare:")),
            (std::vector<std::string>{"file10", "file2"}));
}

TEST(KRSortDescriptorTest, NamedComparisonOfNonStringsFallsBackToNaturalOrder) {
  const auto descriptor = KRSortDescriptor::sortDescriptorWithKey("SELF", true, "caseInsensitiveCompare:");
  EXPECT_EQ(descriptor->compareObject(KRValue(10), KRValue(9)), KROrderedDescending);
  EXPECT_EQ(descriptor->compareObject(KRValue(), KRValue("a")), KROrderedAscending);
  EXPECT_EQ(descriptor->compareObject(KRValue(1), KRValue("a")), KROrderedAscending);
}

TEST(KRSortDescriptorTest, UnknownSelectorRaisesInvalidArgument) {
  try {
    KRSortDescriptor::sortDescriptorWithKey("name", true, "compareByColour:");
    FAIL() << "expected an exception";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRString(KRException::NSInvalidArgumentException));
    EXPECT_NE(exception.reason().str().find("compareByColour:"), std::string::npos);
  }
  EXPECT_THROW(KRSortDescriptor::sortDescriptorWithKey("name", true, ""), KRException);
  EXPECT_THROW(KRSortDescriptor::sortDescriptorWithKey("name", true, KRValueComparator()), KRException);
}

TEST(KRSortDescriptorTest, ComparatorReceivesKeyPathValues) {
  std::vector<std::string> seen;
  const auto byLength =
      KRSortDescriptor::sortDescriptorWithKey("name", true, [&seen](const KRValue& a, const KRValue& b) {
        seen.push_back(a.description());
        return a.string().length() < b.string().length()   ? KROrderedAscending
               : a.string().length() > b.string().length() ? KROrderedDescending
                                                           : KROrderedSame;
      });
  EXPECT_TRUE(byLength->selectorName().empty());
  EXPECT_EQ(byLength->description(), "(name, ascending, <comparator>)");
  EXPECT_EQ(byLength->compareObject(record("ccc", 0), record("a", 0)), KROrderedDescending);
  EXPECT_EQ(seen, std::vector<std::string>{"ccc"});
  const std::vector<KRValue> records = {record("ccc", 0), record("a", 1), record("bb", 2), record("d", 3)};
  EXPECT_EQ(names(KRSortDescriptor::sortedArrayUsingDescriptors(records, {byLength})),
            (std::vector<std::string>{"a", "d", "bb", "ccc"}));
  EXPECT_EQ(byLength->reversedSortDescriptor()->compareObject(record("ccc", 0), record("a", 0)),
            KROrderedAscending);
}

TEST(KRSortDescriptorTest, KeyPathsReachThroughDictionariesAndObjects) {
  const auto byMake = KRSortDescriptor::sortDescriptorWithKey("camera.make", true);
  const std::vector<std::shared_ptr<Photo>> photos = {
      std::make_shared<Photo>("nikon", 3, KRDictionary{{"make", "Nikon"}}),
      std::make_shared<Photo>("canon", 5, KRDictionary{{"make", "Canon"}}),
      std::make_shared<Photo>("unknown", 4, KRDictionary::dictionary())};
  const auto sorted = KRSortDescriptor::sortedArrayUsingDescriptors(photos, {byMake});
  ASSERT_EQ(sorted.size(), 3u);
  EXPECT_EQ(sorted[0]->name(), "unknown");
  EXPECT_EQ(sorted[1]->name(), "canon");
  EXPECT_EQ(sorted[2]->name(), "nikon");
  EXPECT_EQ(sorted[1], photos[1]);
  const KRValue nested = KRDictionary{{"camera", KRDictionary{{"make", "Sony"}}}};
  EXPECT_EQ(byMake->compareObject(nested, KRValue(photos[0])), KROrderedDescending);
  EXPECT_EQ(KRSortDescriptor::sortDescriptorWithKey("rating", false)->compareObject(photos[0], photos[1]),
            KROrderedDescending);
}

TEST(KRSortDescriptorTest, UnknownKeyOfAnObjectRaises) {
  const auto photo = std::make_shared<Photo>("p", 1, KRDictionary());
  const auto descriptor = KRSortDescriptor::sortDescriptorWithKey("colour", true);
  try {
    descriptor->compareObject(photo, photo);
    FAIL() << "expected an exception";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRString(KRException::NSUnknownKeyException));
  }
}

TEST(KRSortDescriptorTest, SelfAndEmptyKeyPathCompareTheObjectsThemselves) {
  for (const char* key : {"", "SELF", "self"}) {
    const auto descriptor = KRSortDescriptor::sortDescriptorWithKey(key, true);
    EXPECT_EQ(descriptor->keyValueOfObject(KRValue(7)), KRValue(7)) << key;
    EXPECT_EQ(descriptor->compareObject(KRValue("a"), KRValue("b")), KROrderedAscending) << key;
  }
}

TEST(KRSortDescriptorTest, DescendingAndReversedDescriptors) {
  const auto ascending = KRSortDescriptor::sortDescriptorWithKey("value", true, "caseInsensitiveCompare:");
  const auto descending = ascending->reversedSortDescriptor();
  EXPECT_EQ(descending->key(), "value");
  EXPECT_FALSE(descending->ascending());
  EXPECT_EQ(descending->selectorName(), "caseInsensitiveCompare:");
  EXPECT_EQ(descending->compareObject(record("x", "a"), record("y", "B")), KROrderedDescending);
  EXPECT_EQ(descending->compareObject(record("x", "b"), record("y", "B")), KROrderedSame);
  EXPECT_TRUE(descending->reversedSortDescriptor()->isEqual(ascending));
  EXPECT_EQ(descending->reversedSortDescriptor()->hash(), ascending->hash());
  EXPECT_FALSE(descending->isEqual(ascending));
  EXPECT_FALSE(KRSortDescriptor::sortDescriptorWithKey("value", true)->isEqual(ascending));
  const auto byComparator = KRSortDescriptor::sortDescriptorWithKey(
      "value", true, [](const KRValue&, const KRValue&) { return KROrderedSame; });
  EXPECT_TRUE(byComparator->isEqual(byComparator));
  EXPECT_FALSE(byComparator->isEqual(byComparator->reversedSortDescriptor()->reversedSortDescriptor()));
}

TEST(KRSortDescriptorTest, LaterDescriptorsBreakTiesAndEqualValuesKeepInputOrder) {
  const std::vector<KRValue> records = {record("b", 2), record("a", 1), record("c", 2),
                                        record("a", 2), record("b", 1), record("c", 2)};
  const KRSortDescriptors byValueThenName = {KRSortDescriptor::sortDescriptorWithKey("value", false),
                                             KRSortDescriptor::sortDescriptorWithKey("name", true)};
  const std::vector<KRValue> sorted = KRSortDescriptor::sortedArrayUsingDescriptors(records, byValueThenName);
  EXPECT_EQ(names(sorted), (std::vector<std::string>{"a", "b", "c", "c", "a", "b"}));
  EXPECT_TRUE(identical(sorted[2], records[2]));
  EXPECT_TRUE(identical(sorted[3], records[5]));
  const std::vector<KRValue> byValueOnly = KRSortDescriptor::sortedArrayUsingDescriptors(
      records, {KRSortDescriptor::sortDescriptorWithKey("value", true)});
  EXPECT_EQ(names(byValueOnly), (std::vector<std::string>{"a", "b", "b", "c", "a", "c"}));
  EXPECT_EQ(names(KRSortDescriptor::sortedArrayUsingDescriptors(records, {})), names(records));
}

TEST(KRSortDescriptorTest, CompareWithDescriptorsAnswersTheFirstDifference) {
  const KRSortDescriptors descriptors = {KRSortDescriptor::sortDescriptorWithKey("value", true),
                                         KRSortDescriptor::sortDescriptorWithKey("name", false)};
  EXPECT_EQ(KRSortDescriptor::compareWithDescriptors(record("a", 1), record("b", 2), descriptors),
            KROrderedAscending);
  EXPECT_EQ(KRSortDescriptor::compareWithDescriptors(record("a", 1), record("b", 1), descriptors),
            KROrderedDescending);
  EXPECT_EQ(KRSortDescriptor::compareWithDescriptors(record("a", 1), record("a", 1), descriptors),
            KROrderedSame);
  EXPECT_EQ(KRSortDescriptor::compareWithDescriptors(record("a", 1), record("b", 2), {}), KROrderedSame);
}

TEST(KRSortDescriptorTest, TenThousandRecordsSortStably) {
  std::mt19937 random(20240611);
  std::vector<KRValue> records;
  for (int i = 0; i < 10000; ++i) {
    records.push_back(KRDictionary{
        {"group", static_cast<int>(random() % 50)}, {"label", randomLabel(random)}, {"index", i}});
  }
  const KRSortDescriptors descriptors = {
      KRSortDescriptor::sortDescriptorWithKey("group", true),
      KRSortDescriptor::sortDescriptorWithKey("label", false, "caseInsensitiveCompare:")};
  const std::vector<KRValue> sorted = KRSortDescriptor::sortedArrayUsingDescriptors(records, descriptors);
  ASSERT_EQ(sorted.size(), records.size());
  const auto before = [&descriptors](const KRValue& a, const KRValue& b) {
    return KRSortDescriptor::compareWithDescriptors(a, b, descriptors) == KROrderedAscending;
  };
  EXPECT_TRUE(std::is_sorted(sorted.begin(), sorted.end(), before));
  for (size_t i = 1; i < sorted.size(); ++i) {
    if (KRSortDescriptor::compareWithDescriptors(sorted[i - 1], sorted[i], descriptors) != KROrderedSame)
      continue;
    ASSERT_LT(sorted[i - 1].valueForKey("index").number().longLongValue(),
              sorted[i].valueForKey("index").number().longLongValue());
  }
}

TEST(KRSortDescriptorTest, ComparesFromSeveralThreadsAtOnce) {
  const auto descriptor = KRSortDescriptor::sortDescriptorWithKey("name", true, "localizedCompare:");
  std::vector<KRValue> records;
  for (int i = 0; i < 300; ++i) records.push_back(record("name " + std::to_string((i * 37) % 300), i));
  const std::vector<std::string> expected =
      names(KRSortDescriptor::sortedArrayUsingDescriptors(records, {descriptor}));
  std::vector<std::vector<std::string>> results(4);
  std::vector<std::thread> threads;
  for (auto& result : results) {
    threads.emplace_back(
        [&] { result = names(KRSortDescriptor::sortedArrayUsingDescriptors(records, {descriptor})); });
  }
  for (auto& thread : threads) thread.join();
  for (const auto& result : results) EXPECT_EQ(result, expected);
}
