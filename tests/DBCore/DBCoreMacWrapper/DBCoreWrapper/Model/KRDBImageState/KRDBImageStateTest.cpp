#include "Model/KRDBImageState/KRDBImageState.hpp"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "KREntityClassChecks.hpp"
#include "KREntityObserverRecorder.hpp"
#include "KRRecordFieldRows.hpp"
#include "Support/KRDBRecordConversions.hpp"
#include "dbimage.hpp"

namespace {

using dbcore::DBImgHistoryState;
using Checks = KREntityClassChecks<KRDBImageState, dbcore::DBImgHistoryState, dbcore::DBImage>;
using Row = KRRecordProperty<KRDBImageState>;

TEST(KRDBImageStateTest, TypeNumbers) {
  EXPECT_EQ(KRDBImageState::entityType(), 10);
  EXPECT_EQ(KRDBImageState::dbEntityType(), 6);
}

TEST(KRDBImageStateTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBImageStateTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBImageStateTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBImageStateTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

std::shared_ptr<KRTCropDescription> crop(double x) {
  return KRTCropDescription::initWithCropRect(KRRect{{x, 20}, {300, 200}}, KRSize{4000, 3000});
}

std::wstring cropText(const std::shared_ptr<KRTCropDescription>& description) {
  return KRDBRecordConversions::wideString(KRString(description->plistSerialization()));
}

std::shared_ptr<DBImgHistoryState> stateRecord() {
  auto record = std::make_shared<DBImgHistoryState>();
  record->set_id(5);
  record->action_name = L"Crop";
  record->additional_info = L"{\"exposure\":0.5}";
  record->guid = L"0F8B5A2E-guid";
  record->crop_description = cropText(crop(10));
  record->image_orientation = 6;
  record->state_hash = L"abc123";
  record->original = true;
  return record;
}

std::shared_ptr<KRDBImageState> makeState() { return KRDBImageState::initWithDBEntity(stateRecord()); }

TEST(KRDBImageStateTest, TheRecordGivesEveryFieldAndTheCropFromItsText) {
  const auto record = stateRecord();
  const auto state = KRDBImageState::initWithDBEntity(record);
  EXPECT_EQ(state->dbstate(), record);
  EXPECT_EQ(state->actionName(), KRString("Crop"));
  EXPECT_EQ(state->additionalInfo(), KRString("{\"exposure\":0.5}"));
  EXPECT_EQ(state->guid(), KRString("0F8B5A2E-guid"));
  ASSERT_TRUE(state->cropDesc());
  EXPECT_TRUE(state->cropDesc()->isEqual(crop(10)));
  EXPECT_EQ(state->imageOrientation(), 6u);
  EXPECT_EQ(state->stateHash(), KRString("abc123"));
  EXPECT_TRUE(state->isOriginal());
}

TEST(KRDBImageStateTest, StatesLoadedWithOneActionNameShareItsObjectButNotTheirGuids) {
  const auto first = makeState();
  const auto second = makeState();
  EXPECT_TRUE(identical(first->actionName(), second->actionName()));
  EXPECT_FALSE(identical(first->guid(), second->guid()));
  EXPECT_EQ(first->guid(), second->guid());
}

TEST(KRDBImageStateTest, ARecordOfAnotherClassGivesAnEmptyState) {
  const auto state = KRDBImageState::initWithDBEntity(std::make_shared<dbcore::DBImage>());
  ASSERT_TRUE(state);
  EXPECT_EQ(state->dbstate(), nullptr);
  EXPECT_EQ(state->cropDesc(), nullptr);
}

TEST(KRDBImageStateTest, TheChangeKeysHoldTheirOwnNames) {
  EXPECT_STREQ(kKRDBImageStateDidChangeActionName, "kKRDBImageStateDidChangeActionName");
  EXPECT_STREQ(kKRDBImageStateDidChangeAdditionaInfo, "kKRDBImageStateDidChangeAdditionaInfo");
  EXPECT_STREQ(kKRDBImageStateDidChangeGuid, "kKRDBImageStateDidChangeGuid");
  EXPECT_STREQ(kKRDBImageStateDidChangeCropDesc, "kKRDBImageStateDidChangeCropDesc");
  EXPECT_STREQ(kKRDBImageStateDidChangeImageOrientation, "kKRDBImageStateDidChangeImageOrientation");
  EXPECT_STREQ(kKRDBImageStateDidChangeStateHash, "kKRDBImageStateDidChangeStateHash");
  EXPECT_STREQ(kKRDBImageStateDidChangeOriginal, "kKRDBImageStateDidChangeOriginal");
}

// Every record-backed property with its exact change key and record conversion; the crop crosses as its
// property-list text.
TEST(KRDBImageStateTest, EveryRecordFieldFollowsTheSetterProtocol) {
  using S = KRDBImageState;
  using R = DBImgHistoryState;
  const auto newCrop = crop(55.5);
  const std::vector<Row> rows{
      recordFieldRow("actionName", "kKRDBImageStateDidChangeActionName", &S::setActionName, &S::actionName,
                     KRString("Exposure \u00e9"), &R::action_name, std::wstring(L"Exposure \u00e9")),
      recordFieldRow("additionalInfo", "kKRDBImageStateDidChangeAdditionaInfo", &S::setAdditionalInfo,
                     &S::additionalInfo, KRString("{}"), &R::additional_info, std::wstring(L"{}")),
      recordFieldRow("guid", "kKRDBImageStateDidChangeGuid", &S::setGuid, &S::guid, KRString("G-2"), &R::guid,
                     std::wstring(L"G-2")),
      recordFieldRow("cropDesc", "kKRDBImageStateDidChangeCropDesc", &S::setCropDesc, &S::cropDesc, newCrop,
                     &R::crop_description, cropText(newCrop)),
      recordFieldRow("imageOrientation", "kKRDBImageStateDidChangeImageOrientation", &S::setImageOrientation,
                     &S::imageOrientation, uint64_t{8}, &R::image_orientation, uint64_t{8}),
      recordFieldRow("stateHash", "kKRDBImageStateDidChangeStateHash", &S::setStateHash, &S::stateHash,
                     KRString("h2"), &R::state_hash, std::wstring(L"h2")),
      recordFieldRow("original", "kKRDBImageStateDidChangeOriginal", &S::setOriginal, &S::isOriginal, false,
                     &R::original, false),
  };
  expectSetterProtocol<S>(makeState, rows);
}

TEST(KRDBImageStateTest, TheCurrentOrientationPostsNothing) {
  const auto state = makeState();
  const auto observer = KREntityObserverRecorder::observing(*state);
  state->setImageOrientation(6);
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(state->isDbEntityChanged());
}

TEST(KRDBImageStateTest, AdditionalInfoPostsItsKeyWithoutTheSecondL) {
  const auto state = makeState();
  const auto observer = KREntityObserverRecorder::observing(*state);
  state->setAdditionalInfo("{\"exposure\":1}");
  ASSERT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
  EXPECT_EQ(observer->events[1].info, KRDictionary({{"kKRDBImageStateDidChangeAdditionaInfo", true}}));
  EXPECT_EQ(state->dbstate()->additional_info, L"{\"exposure\":1}");
}

TEST(KRDBImageStateTest, TheStatesAdditionalInfoIsItsOwnFieldNotTheBaseAnnotations) {
  const auto state = makeState();
  static_cast<KRDBEntity&>(*state).additionalInfo()["note"] = KRValue("kept apart");
  EXPECT_EQ(state->additionalInfo(), KRString("{\"exposure\":0.5}"));
  EXPECT_EQ(static_cast<KRDBEntity&>(*state).additionalInfo().at("note"), KRValue("kept apart"));
}

TEST(KRDBImageStateTest, AStateWithoutCropStoresAnEmptyFieldAndLoadsBackWithout) {
  const auto record = stateRecord();
  const auto state = KRDBImageState::initWithDBEntity(record);
  state->setCropDesc(nullptr);
  EXPECT_EQ(record->crop_description, L"");
  EXPECT_EQ(KRDBImageState::initWithDBEntity(record)->cropDesc(), nullptr);
  const auto fresh = KRDBImageState::initWithDBEntity(std::make_shared<DBImgHistoryState>());
  EXPECT_EQ(fresh->cropDesc(), nullptr);
  EXPECT_EQ(fresh->dbstate()->crop_description, L"");
}

TEST(KRDBImageStateTest, ACropRoundTripsThroughTheRecord) {
  const auto record = stateRecord();
  const auto state = KRDBImageState::initWithDBEntity(record);
  const auto description =
      KRTCropDescription::initWithCropRect(KRRect{{0.1, 1.0 / 3}, {2.5, 7}}, KRSize{9, 11});
  state->setCropDesc(description);
  const auto reloaded = KRDBImageState::initWithDBEntity(record)->cropDesc();
  ASSERT_TRUE(reloaded);
  EXPECT_TRUE(reloaded->isEqual(description));
}

TEST(KRDBImageStateTest, AnEqualButDistinctCropCountsAsAChange) {
  const auto state = makeState();
  const auto observer = KREntityObserverRecorder::observing(*state);
  const auto equal = crop(10);
  ASSERT_TRUE(equal->isEqual(state->cropDesc()));
  state->setCropDesc(equal);
  EXPECT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
  EXPECT_EQ(state->cropDesc(), equal);
}

TEST(KRDBImageStateTest, UnreadableCropTextLoadsAsNoCrop) {
  auto record = stateRecord();
  record->crop_description = L"<plist>not a crop";
  EXPECT_EQ(KRDBImageState::initWithDBEntity(record)->cropDesc(), nullptr);
}

TEST(KRDBImageStateTest, TheStateDictionaryDescribesEveryValue) {
  const auto state = makeState();
  const KRDictionary expected{
      {"guid", "0F8B5A2E-guid"},
      {"actionName", "Crop"},
      {"additionalInfo", "{\"exposure\":0.5}"},
      {"cropInfo", crop(10)->cropDescriptionDictionary()},
      {"imageOrientationInfo", uint64_t{6}},
      {"hash", "abc123"},
      {"original", true},
  };
  const KRDictionary dictionary = state->imageStateDictionary();
  EXPECT_EQ(dictionary, expected);
  EXPECT_EQ(dictionary.objectForKey("imageOrientationInfo").number().unsignedLongLongValue(), 6u);
  std::vector<std::string> keys;
  for (const auto& entry : dictionary.entries()) keys.push_back(entry.first.string().str());
  EXPECT_EQ(keys, (std::vector<std::string>{"guid", "actionName", "additionalInfo", "cropInfo",
                                            "imageOrientationInfo", "hash", "original"}));
}

TEST(KRDBImageStateTest, TheStateDictionaryLeavesOutMissingValues) {
  const auto state = makeState();
  state->setGuid(KRString());
  state->setCropDesc(nullptr);
  state->setStateHash(KRString());
  const KRDictionary expected{
      {"actionName", "Crop"},
      {"additionalInfo", "{\"exposure\":0.5}"},
      {"imageOrientationInfo", uint64_t{6}},
      {"original", true},
  };
  EXPECT_EQ(state->imageStateDictionary(), expected);
}

TEST(KRDBImageStateTest, FieldsAreReachedByKey) {
  const auto state = makeState();
  EXPECT_EQ(state->valueForKey("actionName"), KRValue("Crop"));
  EXPECT_EQ(state->valueForKey("imageOrientation"), KRValue(uint64_t{6}));
  EXPECT_EQ(state->valueForKey("cropDesc").object(), state->cropDesc());
  EXPECT_EQ(state->valueForKey("original"), KRValue(true));
  state->setValueForKey("Rotate", "actionName");
  state->setValueForKey(3, "imageOrientation");
  state->setValueForKey(KRValue(crop(1)), "cropDesc");
  EXPECT_EQ(state->actionName(), KRString("Rotate"));
  EXPECT_EQ(state->dbstate()->image_orientation, 3u);
  EXPECT_TRUE(state->cropDesc()->isEqual(crop(1)));
}

}  // namespace
