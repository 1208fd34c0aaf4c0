#include "Model/KRDBBaseFolderAttributes/KRDBBaseFolderAttributes.hpp"

#include <gtest/gtest.h>

#include <utility>

#include "KREntityObserverRecorder.hpp"
#include "Model/KRDBBaseFolderAttributes/KRDBFilterType.hpp"
#include "Model/KRDBCollectionAttributes/KRDBCollectionAttributes.hpp"
#include "Model/KRDBSmartFilterAttributes/KRDBSmartFilterAttributes.hpp"
#include "dbconstants.hpp"

namespace {

// The plain accessors of the base are reached through smart-filter attributes, whose favorite setter is the
// base's.
std::shared_ptr<KRDBSmartFilterAttributes> attributes(const std::wstring& stored) {
  auto record = std::make_shared<dbcore::DBSmartFilterAttrib>();
  record->selected_filter_types = stored;
  return KRDBSmartFilterAttributes::initWithDBEntity(record);
}

TEST(KRDBBaseFolderAttributesTest, ChangeKeysAreTheirOwnNames) {
  EXPECT_STREQ(kKRDBBaseFolderAttributesDidChangeFavorite, "kKRDBBaseFolderAttributesDidChangeFavorite");
  EXPECT_STREQ(kKRDBBaseFolderAttributesDidChangeSelectedFilterTypes,
               "kKRDBBaseFolderAttributesDidChangeSelectedFilterTypes");
}

TEST(KRDBBaseFolderAttributesTest, FilterTypeValues) {
  const std::vector<std::pair<int64_t, int64_t>> table{
      {KRDBFilterTypeAllPhotos, 0},
      {KRDBFilterTypeFavorites, 1},
      {KRDBFilterTypeStarred5Stars, 2},
      {KRDBFilterTypeStarred4AndMoreStars, 3},
      {KRDBFilterTypeStarred3AndMoreStars, 4},
      {KRDBFilterTypeStarred2AndMoreStars, 5},
      {KRDBFilterTypeStarred1AndMoreStars, 6},
      {KRDBFilterTypeStarred0Stars, 7},
      {KRDBFilterTypeUnflagged, 8},
      {KRDBFilterTypeFlagged, 9},
      {KRDBFilterTypeRejected, 10},
      {KRDBFilterTypeLabeled, 11},
      {KRDBFilterTypeLabeledRed, 12},
      {KRDBFilterTypeLabeledYellow, 13},
      {KRDBFilterTypeLabeledGreen, 14},
      {KRDBFilterTypeLabeledBlue, 15},
      {KRDBFilterTypeLabeledPurple, 16},
      {KRDBFilterTypeLabeledNone, 17},
      {KRDBFilterTypeEdited, 18},
      {KRDBFilterTypeExported, 19},
      {KRDBFilterTypeUnseen, 20},
      {KRDBFilterTypeSeen, 21},
      {KRDBFilterTypeUnedited, 22},
      {KRDBFilterTypeStarred4Stars, 23},
      {KRDBFilterTypeStarred3Stars, 24},
      {KRDBFilterTypeStarred2Stars, 25},
      {KRDBFilterTypeStarred1Star, 26},
  };
  for (size_t row = 0; row < table.size(); ++row) {
    EXPECT_EQ(table[row].first, table[row].second) << "row " << row;
  }
  static_assert(std::is_same_v<decltype(KRDBFilterTypeStarred1Star), const int64_t>);
}

TEST(KRDBBaseFolderAttributesTest, TheStoredTextIsSplitAtEveryDelimiter) {
  const std::wstring& delimiter = dbcore::kUserConditionsDelimiter;
  EXPECT_EQ(attributes(L"a" + delimiter + L"b")->selectedFilterTypes(), KRSet({"a", "b"}));
  EXPECT_EQ(attributes(L"3")->selectedFilterTypes(), KRSet({"3"}));
  EXPECT_EQ(attributes(L"a" + delimiter + delimiter + L"b")->selectedFilterTypes(), KRSet({"a", "", "b"}));
  EXPECT_EQ(attributes(L"a" + delimiter + L"a")->selectedFilterTypes(), KRSet({"a"}));
}

TEST(KRDBBaseFolderAttributesTest, AnEmptyStoredTextGivesASetOfOneEmptyString) {
  const KRSet types = attributes(L"")->selectedFilterTypes();
  EXPECT_EQ(types.count(), 1u);
  EXPECT_TRUE(types.containsObject(""));
}

TEST(KRDBBaseFolderAttributesTest, TheSetIsJoinedInItsOrder) {
  const auto folderAttributes = attributes(L"");
  folderAttributes->KRDBBaseFolderAttributes::setSelectedFilterTypes(KRSet({"2", "x", "10"}));
  EXPECT_EQ(folderAttributes->selectedFilterTypesWString(),
            L"2" + dbcore::kUserConditionsDelimiter + L"x" + dbcore::kUserConditionsDelimiter + L"10");
  folderAttributes->KRDBBaseFolderAttributes::setSelectedFilterTypes(KRSet());
  EXPECT_EQ(folderAttributes->selectedFilterTypesWString(), L"");
  folderAttributes->KRDBBaseFolderAttributes::setSelectedFilterTypes(KRSet::set());
  EXPECT_EQ(folderAttributes->selectedFilterTypesWString(), L"");
}

TEST(KRDBBaseFolderAttributesTest, TheWideStringSetterStoresSilently) {
  const auto folderAttributes = attributes(L"");
  const auto record = folderAttributes->dbattrib();
  const auto observer = KREntityObserverRecorder::observing(*folderAttributes);
  folderAttributes->setSelectedFilterTypesWithWString(L"5");
  EXPECT_EQ(folderAttributes->selectedFilterTypes(), KRSet({"5"}));
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(folderAttributes->isDbEntityChanged());
  EXPECT_EQ(record->selected_filter_types, L"");
}

TEST(KRDBBaseFolderAttributesTest, FieldsAreReachedByKey) {
  const auto collectionAttributes =
      KRDBCollectionAttributes::initWithDBEntity(std::make_shared<dbcore::DBFilterAttrib>());
  collectionAttributes->setValueForKey(true, "favorite");
  EXPECT_TRUE(collectionAttributes->dbattrib()->favorite);
  EXPECT_EQ(collectionAttributes->valueForKey("favorite"), KRValue(true));
  collectionAttributes->setValueForKey(KRSet({"9"}), "selectedFilterTypes");
  EXPECT_EQ(collectionAttributes->dbattrib()->selected_filter_types, L"9");
  EXPECT_EQ(collectionAttributes->valueForKey("selectedFilterTypes"), KRValue(KRSet({"9"})));
}

}  // namespace
