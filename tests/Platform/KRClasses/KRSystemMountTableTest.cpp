#include "KRClasses/KRSystemMountTable.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <fstream>

#include "KRClasses/KRVolumeInfo.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

class MountsCounter : public KRMountTableObserver {
 public:
  void mountTableDidChange(const std::vector<KRMountEntry>& mounts) override { lastCount = mounts.size(); }
  size_t lastCount = 0;
};

}  // namespace

TEST(KRSystemMountTableTest, ListsTheRootFileSystemWithItsType) {
  const auto mounts = KRSystemMountTable::sharedMountTable()->mounts();
  const auto root =
      std::find_if(mounts.begin(), mounts.end(), [](const auto& entry) { return entry.mountPoint == "/"; });
  ASSERT_NE(root, mounts.end());
  EXPECT_FALSE(root->fileSystemType.empty());
  EXPECT_GT(root->totalSize, 0u);
}

TEST(KRSystemMountTableTest, VolumeOfATemporaryPathHasAMountPointPrefix) {
  const auto info = KRVolumeInfo::volumeInfoForPath("/tmp/x", KRSystemMountTable::sharedMountTable());
  ASSERT_NE(info, nullptr);
  const std::string mountPoint = info->mountPoint().str();
  EXPECT_TRUE(mountPoint == "/" || mountPoint == "/tmp") << mountPoint;
  EXPECT_FALSE(info->fileSystemType().empty());
}

TEST(KRSystemMountTableTest, ReadsEntriesOfAMountInfoFile) {
  const KRTemporaryDirectory directory;
  std::ofstream(directory.file("mountinfo"))
      << "22 1 8:1 / / rw,relatime shared:1 - ext4 /dev/kr-test-root rw\n"
      << "23 22 0:30 / /mnt/my\\040photos rw,relatime - tmpfs scratch rw,size=4k\n";
  const auto mounts = KRSystemMountTable::mountTableWithMountInfoFile(directory.file("mountinfo"))->mounts();
  ASSERT_EQ(mounts.size(), 2u);
  EXPECT_EQ(mounts[0].mountPoint, "/");
  EXPECT_EQ(mounts[0].device, "/dev/kr-test-root");
  EXPECT_EQ(mounts[0].fileSystemType, "ext4");
  EXPECT_EQ(mounts[0].volumeUUID, "");
  EXPECT_EQ(mounts[1],
            (KRMountEntry{.mountPoint = "/mnt/my photos", .device = "scratch", .fileSystemType = "tmpfs"}));
}

TEST(KRSystemMountTableTest, UnreadableMountInfoFileGivesNoMounts) {
  EXPECT_TRUE(KRSystemMountTable::mountTableWithMountInfoFile("/nonexistent/kr-mountinfo")->mounts().empty());
}

TEST(KRSystemMountTableTest, SharedTableIsOneObjectWhileHeld) {
  const auto table = KRSystemMountTable::sharedMountTable();
  EXPECT_EQ(KRSystemMountTable::sharedMountTable(), table);
}

TEST(KRSystemMountTableTest, FirstObserverStartsTheMonitor) {
  const auto table = KRSystemMountTable::mountTableWithMountInfoFile(KRSystemMountTable::kernelMountInfoPath);
  EXPECT_FALSE(table->isMonitoring());
  const auto observer = std::make_shared<MountsCounter>();
  table->addObserver(observer);
  EXPECT_TRUE(table->isMonitoring());
  EXPECT_GT(observer->lastCount, 0u);
}

TEST(KRSystemMountTableTest, DestroyingTheTableStopsItsMonitorQuickly) {
  auto table = KRSystemMountTable::mountTableWithMountInfoFile(KRSystemMountTable::kernelMountInfoPath);
  const auto observer = std::make_shared<MountsCounter>();
  table->addObserver(observer);
  ASSERT_TRUE(table->isMonitoring());
  const std::weak_ptr<KRSystemMountTable> weakTable = table;
  const auto start = std::chrono::steady_clock::now();
  table.reset();
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(1));
  EXPECT_TRUE(weakTable.expired());
}
