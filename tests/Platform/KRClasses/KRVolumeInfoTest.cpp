#include "KRClasses/KRVolumeInfo.hpp"

#include <gtest/gtest.h>

#include "KRFoundation/KRJSON.hpp"
#include "support/KRFakeMountTable.hpp"

namespace {

KRMountEntry mountAt(std::string mountPoint) {
  return {.mountPoint = std::move(mountPoint), .device = "/dev/sdb1", .fileSystemType = "ext4"};
}

KRMountEntry photoDisk() {
  return {.mountPoint = "/media/photos",
          .device = "/dev/sdc1",
          .fileSystemType = "exfat",
          .volumeUUID = "5A3E-1C2D",
          .label = "Holidays",
          .totalSize = 512'000'000'000ULL};
}

std::shared_ptr<KRFakeMountTable> tableWithMountPoints(std::initializer_list<const char*> mountPoints) {
  std::vector<KRMountEntry> mounts;
  for (const char* mountPoint : mountPoints) mounts.push_back(mountAt(mountPoint));
  return KRFakeMountTable::create(std::move(mounts));
}

std::string mountPointForPath(const char* path, const std::shared_ptr<KRMountTable>& table) {
  const auto info = KRVolumeInfo::volumeInfoForPath(path, table);
  return info ? info->mountPoint().str() : "<nil>";
}

}  // namespace

TEST(KRVolumeInfoTest, PicksTheLongestMountPointHoldingThePath) {
  const auto table = tableWithMountPoints({"/", "/mnt/photos", "/mnt", "/mnt/photos/raw"});
  EXPECT_EQ(mountPointForPath("/mnt/photos/2024/a.jpg", table), "/mnt/photos");
  EXPECT_EQ(mountPointForPath("/mnt/photos/raw/b.cr2", table), "/mnt/photos/raw");
  EXPECT_EQ(mountPointForPath("/mnt/other", table), "/mnt");
  EXPECT_EQ(mountPointForPath("/home/user", table), "/");
}

TEST(KRVolumeInfoTest, MountPointMatchesOnlyOnAComponentBoundary) {
  const auto table = tableWithMountPoints({"/", "/mnt/photo"});
  EXPECT_EQ(mountPointForPath("/mnt/photos/x", table), "/");
  EXPECT_EQ(mountPointForPath("/mnt/photo-backup", table), "/");
  EXPECT_EQ(mountPointForPath("/mnt/photo/x", table), "/mnt/photo");
}

TEST(KRVolumeInfoTest, MountPointItselfAndTrailingSlashesAreOnTheVolume) {
  const auto table = tableWithMountPoints({"/", "/mnt/photo"});
  EXPECT_EQ(mountPointForPath("/mnt/photo", table), "/mnt/photo");
  EXPECT_EQ(mountPointForPath("/mnt/photo/", table), "/mnt/photo");
  EXPECT_EQ(mountPointForPath("/", table), "/");
}

TEST(KRVolumeInfoTest, PathIsNormalisedBeforeMatching) {
  const auto table = tableWithMountPoints({"/", "/mnt/photo"});
  EXPECT_EQ(mountPointForPath("/mnt/photo/../other/x", table), "/");
  EXPECT_EQ(mountPointForPath("/mnt/./photo//x", table), "/mnt/photo");
}

TEST(KRVolumeInfoTest, NilWithoutAnAbsolutePathOrAHoldingMount) {
  const auto table = tableWithMountPoints({"/mnt/photo"});
  EXPECT_EQ(KRVolumeInfo::volumeInfoForPath(KRString(), table), nullptr);
  EXPECT_EQ(KRVolumeInfo::volumeInfoForPath("", table), nullptr);
  EXPECT_EQ(KRVolumeInfo::volumeInfoForPath("mnt/photo/x", table), nullptr);
  EXPECT_EQ(KRVolumeInfo::volumeInfoForPath("/home/x", table), nullptr);
  EXPECT_EQ(KRVolumeInfo::volumeInfoForPath("/mnt/photo/x", nullptr), nullptr);
}

TEST(KRVolumeInfoTest, StackedMountOverAnotherIsTheVisibleOne) {
  auto upper = mountAt("/mnt/photo");
  upper.device = "/dev/sdd1";
  const auto table = KRFakeMountTable::create({mountAt("/"), mountAt("/mnt/photo"), upper});
  EXPECT_EQ(KRVolumeInfo::volumeInfoForPath("/mnt/photo/x", table)->device(), "/dev/sdd1");
}

TEST(KRVolumeInfoTest, FieldsComeFromTheMount) {
  const auto info =
      KRVolumeInfo::volumeInfoForPath("/media/photos/a.jpg", KRFakeMountTable::create({photoDisk()}));
  ASSERT_NE(info, nullptr);
  EXPECT_EQ(info->mountPoint(), "/media/photos");
  EXPECT_EQ(info->volumeUUID(), "5A3E-1C2D");
  EXPECT_EQ(info->label(), "Holidays");
  EXPECT_EQ(info->fileSystemType(), "exfat");
  EXPECT_EQ(info->device(), "/dev/sdc1");
  EXPECT_EQ(info->totalSize(), 512'000'000'000ULL);
}

TEST(KRVolumeInfoTest, NameFallsBackToTheMountPointName) {
  EXPECT_EQ(KRVolumeInfo::volumeInfoWithMountEntry(mountAt("/media/Card"))->label(), "Card");
  EXPECT_EQ(KRVolumeInfo::volumeInfoWithMountEntry(mountAt("/"))->label(), "/");
}

TEST(KRVolumeInfoTest, DictionarySerialisationUsesTheDocumentedKeys) {
  const auto dictionary = KRVolumeInfo::volumeInfoWithMountEntry(photoDisk())->dictionarySerialization();
  EXPECT_EQ(dictionary, (KRDictionary{{"mountPoint", "/media/photos"},
                                      {"uuid", "5A3E-1C2D"},
                                      {"name", "Holidays"},
                                      {"fsType", "exfat"},
                                      {"totalSize", 512'000'000'000LL},
                                      {"device", "/dev/sdc1"}}));
}

TEST(KRVolumeInfoTest, DictionaryRoundTripsEqual) {
  for (const auto& entry : {photoDisk(), mountAt("/"), KRMountEntry{.mountPoint = "/run/user/1000"}}) {
    const auto info = KRVolumeInfo::volumeInfoWithMountEntry(entry);
    const auto copy = KRVolumeInfo::initWithDictionarySerialization(info->dictionarySerialization());
    ASSERT_NE(copy, nullptr) << entry.mountPoint;
    EXPECT_TRUE(copy->isEqual(info)) << copy->description();
    EXPECT_EQ(copy->hash(), info->hash());
  }
}

TEST(KRVolumeInfoTest, DictionaryRoundTripsThroughJSONText) {
  const auto info = KRVolumeInfo::volumeInfoWithMountEntry(photoDisk());
  const KRString json = KRJSON::stringWithJSONObject(info->dictionarySerialization());
  const auto copy =
      KRVolumeInfo::initWithDictionarySerialization(KRJSON::JSONObjectWithString(json).dictionary());
  ASSERT_NE(copy, nullptr) << json.str();
  EXPECT_TRUE(copy->isEqual(info));
}

TEST(KRVolumeInfoTest, MissingOptionalKeysReadAsEmpty) {
  const auto info =
      KRVolumeInfo::initWithDictionarySerialization(KRDictionary{{"mountPoint", "/media/Card"}});
  ASSERT_NE(info, nullptr);
  EXPECT_EQ(info->volumeUUID(), "");
  EXPECT_EQ(info->label(), "Card");
  EXPECT_EQ(info->totalSize(), 0u);
}

TEST(KRVolumeInfoTest, BadDictionariesGiveNil) {
  const KRDictionary good = KRVolumeInfo::volumeInfoWithMountEntry(photoDisk())->dictionarySerialization();
  EXPECT_EQ(KRVolumeInfo::initWithDictionarySerialization(KRDictionary()), nullptr);
  EXPECT_EQ(KRVolumeInfo::initWithDictionarySerialization(KRDictionary::dictionary()), nullptr);
  const std::vector<std::pair<const char*, KRValue>> badValues = {
      {"mountPoint", ""},           {"mountPoint", 7},  {"uuid", 12},         {"name", KRValue::null()},
      {"fsType", KRArray::array()}, {"device", true},   {"totalSize", "big"}, {"totalSize", -1},
      {"totalSize", 1.5},           {"totalSize", true}};
  for (const auto& [key, value] : badValues) {
    EXPECT_EQ(KRVolumeInfo::initWithDictionarySerialization(good.dictionaryBySettingObject(value, key)),
              nullptr)
        << key << " = " << value.description();
  }
}

TEST(KRVolumeInfoTest, EqualityAndHashAreByValue) {
  const auto info = KRVolumeInfo::volumeInfoWithMountEntry(photoDisk());
  const auto same = KRVolumeInfo::volumeInfoWithMountEntry(photoDisk());
  auto moved = photoDisk();
  moved.mountPoint = "/media/photos2";
  const auto other = KRVolumeInfo::volumeInfoWithMountEntry(moved);
  EXPECT_TRUE(info->isEqual(same));
  EXPECT_EQ(info->hash(), same->hash());
  EXPECT_FALSE(info->isEqual(other));
  EXPECT_NE(info->hash(), other->hash());
  EXPECT_FALSE(info->isEqual(nullptr));
}
