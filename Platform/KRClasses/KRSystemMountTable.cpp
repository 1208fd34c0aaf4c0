#include "KRClasses/KRSystemMountTable.hpp"

#include <blkid/blkid.h>
#include <libmount/libmount.h>
#include <sys/statvfs.h>

#include <cstdlib>
#include <string_view>

#include "KRServices/KRLog.hpp"

namespace {

using MountTablePtr = std::unique_ptr<libmnt_table, decltype(&mnt_unref_table)>;
using MountIteratorPtr = std::unique_ptr<libmnt_iter, decltype(&mnt_free_iter)>;
using BlkidCachePtr = std::unique_ptr<blkid_struct_cache, decltype(&blkid_put_cache)>;

std::string text(const char* value) { return value ? value : ""; }

BlkidCachePtr openBlkidCache() {
  blkid_cache cache = nullptr;
  if (blkid_get_cache(&cache, nullptr) != 0) cache = nullptr;
  return BlkidCachePtr(cache, &blkid_put_cache);
}

// A tag of a block device ("UUID", "LABEL"); empty when the cache does not know it and probing fails.
std::string deviceTag(blkid_cache cache, const char* tag, const std::string& device) {
  if (!cache) return {};
  char* value = blkid_get_tag_value(cache, tag, device.c_str());
  std::string result = text(value);
  free(value);
  return result;
}

// Automounter mount points are skipped: asking their size would mount them.
uint64_t totalSize(const KRMountEntry& entry) {
  struct statvfs info {};
  if (entry.fileSystemType == "autofs" || statvfs(entry.mountPoint.c_str(), &info) != 0) return 0;
  return static_cast<uint64_t>(info.f_blocks) * info.f_frsize;
}

KRMountEntry entryOfFileSystem(libmnt_fs* fs, blkid_cache cache) {
  KRMountEntry entry{.mountPoint = text(mnt_fs_get_target(fs)),
                     .device = text(mnt_fs_get_source(fs)),
                     .fileSystemType = text(mnt_fs_get_fstype(fs))};
  // Only real block devices have tags to look up; virtual file systems name no device node.
  if (std::string_view(entry.device).starts_with("/dev/")) {
    entry.volumeUUID = deviceTag(cache, "UUID", entry.device);
    entry.label = deviceTag(cache, "LABEL", entry.device);
  }
  entry.totalSize = totalSize(entry);
  return entry;
}

}  // namespace

std::shared_ptr<KRSystemMountTable> KRSystemMountTable::sharedMountTable() {
  static std::mutex mutex;
  static std::weak_ptr<KRSystemMountTable> shared;
  std::lock_guard lock(mutex);
  auto table = shared.lock();
  if (!table) {
    table = mountTableWithMountInfoFile(kernelMountInfoPath);
    shared = table;
  }
  return table;
}

std::shared_ptr<KRSystemMountTable> KRSystemMountTable::mountTableWithMountInfoFile(std::string path) {
  return std::shared_ptr<KRSystemMountTable>(new KRSystemMountTable(std::move(path)));
}

KRSystemMountTable::KRSystemMountTable(std::string mountInfoPath)
    : mountInfoPath_(std::move(mountInfoPath)) {}

KRSystemMountTable::~KRSystemMountTable() {
  if (!thread_.joinable()) return;
  monitor_->stop();
  // The monitor thread itself drops the last reference when every observer went away while it was
  // notifying; it then ends on its own, keeping only the monitor alive.
  if (thread_.get_id() == std::this_thread::get_id()) {
    thread_.detach();
  } else {
    thread_.join();
  }
}

std::vector<KRMountEntry> KRSystemMountTable::mounts() const {
  std::vector<KRMountEntry> entries;
  MountTablePtr table(mnt_new_table(), &mnt_unref_table);
  MountIteratorPtr iterator(mnt_new_iter(MNT_ITER_FORWARD), &mnt_free_iter);
  if (!table || !iterator || mnt_table_parse_file(table.get(), mountInfoPath_.c_str()) != 0) return entries;
  const auto cache = openBlkidCache();
  libmnt_fs* fs = nullptr;
  while (mnt_table_next_fs(table.get(), iterator.get(), &fs) == 0)
    entries.push_back(entryOfFileSystem(fs, cache.get()));
  return entries;
}

bool KRSystemMountTable::isMonitoring() const {
  std::lock_guard lock(monitorMutex_);
  return thread_.joinable();
}

void KRSystemMountTable::startMonitoring() {
  std::lock_guard lock(monitorMutex_);
  if (monitoringStarted_) return;
  monitoringStarted_ = true;
  monitor_ = KRMountMonitor::create();
  if (!monitor_) {
    KRLog(4, "KRSystemMountTable cannot watch the kernel mount table; volumes will not follow mount changes");
    return;
  }
  const std::weak_ptr<KRSystemMountTable> weakSelf =
      std::static_pointer_cast<KRSystemMountTable>(shared_from_this());
  thread_ = std::thread(&KRSystemMountTable::watch, monitor_, weakSelf);
}

void KRSystemMountTable::watch(const std::shared_ptr<KRMountMonitor>& monitor,
                               const std::weak_ptr<KRSystemMountTable>& table) {
  while (monitor->waitForChange()) {
    const auto strongTable = table.lock();
    if (!strongTable) return;
    strongTable->notifyObservers();
  }
}
