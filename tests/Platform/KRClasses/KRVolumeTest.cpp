#include "KRClasses/KRVolume.hpp"

#include <gtest/gtest.h>

#include <thread>

#include "KRFoundation/KRRunLoop.hpp"
#include "support/KRFakeMountTable.hpp"

namespace {

KRMountEntry rootDisk() {
  return {.mountPoint = "/", .device = "/dev/sda2", .fileSystemType = "ext4", .volumeUUID = "ROOT-0001"};
}

KRMountEntry photoDisk(std::string mountPoint = "/media/photos") {
  return {.mountPoint = std::move(mountPoint),
          .device = "/dev/sdb1",
          .fileSystemType = "exfat",
          .volumeUUID = "5A3E-1C2D",
          .label = "Photos",
          .totalSize = 1'000'000};
}

KRMountEntry scratchDisk(std::string mountPoint = "/scratch") {
  return {.mountPoint = std::move(mountPoint), .device = "tmpfs", .fileSystemType = "tmpfs"};
}

// Records the notifications of the volumes it listens to as "<volume name>:<event>", reading the volume's
// state when the notification arrives (tests let each change arrive before making the next).
class VolumeRecorder : public KRObject, public KRVolumeObserver {
 public:
  void volumeInfoDidChange(std::shared_ptr<KRVolume> volume) override {
    record(volume, "moved to " + volume->volumeInfo()->mountPoint().str());
  }
  void volumeAppearedStatusDidChange(std::shared_ptr<KRVolume> volume) override {
    record(volume, volume->isAvailable() ? "appeared" : "disappeared");
  }

  std::vector<std::string> events;
  bool calledOffTheMainThread = false;

 private:
  void record(const std::shared_ptr<KRVolume>& volume, const std::string& event) {
    calledOffTheMainThread = calledOffTheMainThread || !KRRunLoop::isMainThread();
    events.push_back(volume->volumeInfo()->label().str() + ":" + event);
  }
};

class KRVolumeTest : public testing::Test {
 protected:
  std::shared_ptr<KRVolume> watchedVolume(const KRMountEntry& entry) {
    auto volume = KRVolume::initWithVolumeInfo(KRVolumeInfo::volumeInfoWithMountEntry(entry), table);
    volume->addListener(recorder);
    return volume;
  }

  // Runs the main run loop until the recorder has `count` events.
  bool waitForEvents(size_t count) {
    return KRRunLoop::currentRunLoop()->runUntil([&] { return recorder->events.size() >= count; },
                                                 KRDate::dateWithTimeIntervalSinceNow(5));
  }

  // Runs the main run loop until everything posted so far has run: a pending notification has arrived.
  std::vector<std::string> eventsAfterPendingNotifications() {
    bool reached = false;
    KRRunLoop::mainRunLoop()->performBlock([&] { reached = true; });
    KRRunLoop::currentRunLoop()->runUntil([&] { return reached; }, KRDate::dateWithTimeIntervalSinceNow(5));
    EXPECT_TRUE(reached);
    return recorder->events;
  }

  std::shared_ptr<KRFakeMountTable> table = KRFakeMountTable::create({rootDisk(), photoDisk()});
  std::shared_ptr<VolumeRecorder> recorder = std::make_shared<VolumeRecorder>();
};

using Events = std::vector<std::string>;

}  // namespace

TEST_F(KRVolumeTest, StartsFromTheCurrentMountTableWithoutNotifying) {
  const auto volume = watchedVolume(photoDisk());
  EXPECT_TRUE(volume->isAvailable());
  EXPECT_EQ(volume->mountPoint(), "/media/photos");
  EXPECT_TRUE(volume->volumeInfo()->isEqual(KRVolumeInfo::volumeInfoWithMountEntry(photoDisk())));
  EXPECT_EQ(eventsAfterPendingNotifications(), Events{});
}

TEST_F(KRVolumeTest, StartsUnavailableWhenNotMounted) {
  table->setMounts({rootDisk()});
  const auto volume = watchedVolume(photoDisk());
  EXPECT_FALSE(volume->isAvailable());
  EXPECT_TRUE(volume->mountPoint().isNil());
  EXPECT_EQ(volume->volumeInfo()->mountPoint(), "/media/photos");
}

TEST_F(KRVolumeTest, StartsFromWhereTheVolumeIsMountedNow) {
  const auto volume = watchedVolume(photoDisk("/media/old-place"));
  EXPECT_EQ(volume->mountPoint(), "/media/photos");
  EXPECT_EQ(volume->volumeInfo()->mountPoint(), "/media/photos");
}

TEST_F(KRVolumeTest, NilWithoutInfoOrMountTable) {
  EXPECT_EQ(KRVolume::initWithVolumeInfo(nullptr, table), nullptr);
  EXPECT_EQ(KRVolume::initWithVolumeInfo(KRVolumeInfo::volumeInfoWithMountEntry(photoDisk()), nullptr),
            nullptr);
}

TEST_F(KRVolumeTest, UnmountingMakesItUnavailable) {
  const auto volume = watchedVolume(photoDisk());
  table->setMounts({rootDisk()});
  EXPECT_FALSE(volume->isAvailable());
  EXPECT_TRUE(volume->mountPoint().isNil());
  EXPECT_EQ(volume->volumeInfo()->mountPoint(), "/media/photos");
  ASSERT_TRUE(waitForEvents(1));
  EXPECT_EQ(eventsAfterPendingNotifications(), Events{"Photos:disappeared"});
}

TEST_F(KRVolumeTest, MountingAgainAtTheSamePlaceMakesItAvailable) {
  const auto volume = watchedVolume(photoDisk());
  table->setMounts({rootDisk()});
  ASSERT_TRUE(waitForEvents(1));
  table->setMounts({rootDisk(), photoDisk()});
  EXPECT_TRUE(volume->isAvailable());
  EXPECT_EQ(volume->mountPoint(), "/media/photos");
  ASSERT_TRUE(waitForEvents(2));
  EXPECT_EQ(eventsAfterPendingNotifications(), (Events{"Photos:disappeared", "Photos:appeared"}));
}

TEST_F(KRVolumeTest, VolumeWithUUIDFollowsItsNewMountPoint) {
  const auto volume = watchedVolume(photoDisk());
  table->setMounts({rootDisk(), photoDisk("/media/photos1")});
  EXPECT_TRUE(volume->isAvailable());
  EXPECT_EQ(volume->mountPoint(), "/media/photos1");
  ASSERT_TRUE(waitForEvents(1));
  EXPECT_EQ(eventsAfterPendingNotifications(), Events{"Photos:moved to /media/photos1"});
}

TEST_F(KRVolumeTest, VolumeReappearingElsewhereTellsItsNewPlaceFirst) {
  const auto volume = watchedVolume(photoDisk());
  table->setMounts({rootDisk()});
  ASSERT_TRUE(waitForEvents(1));
  table->setMounts({rootDisk(), photoDisk("/mnt/usb")});
  ASSERT_TRUE(waitForEvents(3));
  EXPECT_EQ(eventsAfterPendingNotifications(),
            (Events{"Photos:disappeared", "Photos:moved to /mnt/usb", "Photos:appeared"}));
}

TEST_F(KRVolumeTest, RenamedVolumeChangesItsInfo) {
  const auto volume = watchedVolume(photoDisk());
  auto renamed = photoDisk();
  renamed.label = "Archive";
  table->setMounts({rootDisk(), renamed});
  EXPECT_EQ(volume->volumeInfo()->label(), "Archive");
  ASSERT_TRUE(waitForEvents(1));
  EXPECT_EQ(eventsAfterPendingNotifications(), Events{"Archive:moved to /media/photos"});
}

TEST_F(KRVolumeTest, VolumeWithoutUUIDIsIdentifiedByDeviceAndMountPoint) {
  table->setMounts({rootDisk(), scratchDisk()});
  const auto volume = watchedVolume(scratchDisk());
  ASSERT_TRUE(volume->isAvailable());
  table->setMounts({rootDisk(), scratchDisk("/scratch2")});
  EXPECT_FALSE(volume->isAvailable());
  ASSERT_TRUE(waitForEvents(1));
  table->setMounts({rootDisk(), scratchDisk("/scratch2"), scratchDisk()});
  EXPECT_EQ(volume->mountPoint(), "/scratch");
  ASSERT_TRUE(waitForEvents(2));
  EXPECT_EQ(eventsAfterPendingNotifications(), (Events{"scratch:disappeared", "scratch:appeared"}));
}

TEST_F(KRVolumeTest, MountWithUnreadableUUIDIsMatchedByPlace) {
  auto unreadable = photoDisk();
  unreadable.volumeUUID.clear();
  table->setMounts({rootDisk(), unreadable});
  EXPECT_TRUE(watchedVolume(photoDisk())->isAvailable());
}

TEST_F(KRVolumeTest, AnotherVolumeAtTheSamePlaceIsNotThisOne) {
  const auto volume = watchedVolume(photoDisk());
  auto otherCard = photoDisk();
  otherCard.volumeUUID = "0000-BEEF";
  table->setMounts({rootDisk(), otherCard});
  EXPECT_FALSE(volume->isAvailable());
  EXPECT_EQ(volume->volumeInfo()->volumeUUID(), "5A3E-1C2D");
}

TEST_F(KRVolumeTest, ChangesOfOtherMountsNotifyNothing) {
  const auto volume = watchedVolume(photoDisk());
  table->setMounts({rootDisk(), scratchDisk(), photoDisk()});
  EXPECT_EQ(eventsAfterPendingNotifications(), Events{});
}

TEST_F(KRVolumeTest, TwoVolumesShareOneMountTable) {
  table->setMounts({rootDisk(), photoDisk(), scratchDisk()});
  const auto photos = watchedVolume(photoDisk());
  const auto scratch = watchedVolume(scratchDisk());
  EXPECT_EQ(table->observerCount(), 2u);
  table->setMounts({rootDisk(), photoDisk()});
  EXPECT_TRUE(photos->isAvailable());
  EXPECT_FALSE(scratch->isAvailable());
  ASSERT_TRUE(waitForEvents(1));
  EXPECT_EQ(eventsAfterPendingNotifications(), Events{"scratch:disappeared"});
}

TEST_F(KRVolumeTest, DestroyedVolumeLeavesTheMountTable) {
  auto volume = watchedVolume(photoDisk());
  ASSERT_EQ(table->observerCount(), 1u);
  volume.reset();
  EXPECT_EQ(table->observerCount(), 0u);
  table->setMounts({rootDisk()});
  EXPECT_EQ(eventsAfterPendingNotifications(), Events{});
}

TEST_F(KRVolumeTest, VolumeDestroyedBeforeDeliveryNotifiesNobody) {
  auto volume = watchedVolume(photoDisk());
  table->setMounts({rootDisk()});
  volume.reset();
  EXPECT_EQ(eventsAfterPendingNotifications(), Events{});
}

TEST_F(KRVolumeTest, ChangesSeenOnAnotherThreadAreDeliveredOnTheMainThread) {
  const auto volume = watchedVolume(photoDisk());
  std::thread monitor([&] { table->setMounts({rootDisk()}); });
  const bool delivered = waitForEvents(1);
  monitor.join();
  ASSERT_TRUE(delivered);
  EXPECT_EQ(eventsAfterPendingNotifications(), Events{"Photos:disappeared"});
  EXPECT_FALSE(recorder->calledOffTheMainThread);
  EXPECT_FALSE(volume->isAvailable());
}

TEST_F(KRVolumeTest, VolumeOfTheRootDirectoryIsAvailableOnTheSystemMountTable) {
  const auto volume = KRVolume::initWithVolumeInfo(KRVolumeInfo::volumeInfoForPath("/"));
  ASSERT_NE(volume, nullptr);
  EXPECT_TRUE(volume->isAvailable());
  EXPECT_EQ(volume->mountPoint(), "/");
}
