#pragma once

#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "KRClasses/KRMountMonitor.hpp"
#include "KRClasses/KRMountTable.hpp"

// The mount table of the running system: mounts read from /proc/self/mountinfo with libmount, volume
// UUIDs and labels from libblkid (empty where probing needs privileges the process lacks or the file
// system is virtual), capacities from statvfs.
//
// The first observer starts one monitor thread that waits on libmount's kernel monitor and notifies the
// observers after every change. Destroying the table stops the thread at once through an eventfd.
class KRSystemMountTable : public KRMountTable {
 public:
  static constexpr const char* kernelMountInfoPath = "/proc/self/mountinfo";

  // The table every volume shares by default: one object, and so one monitor thread, for as long as
  // anyone holds it.
  static std::shared_ptr<KRSystemMountTable> sharedMountTable();
  // A table of its own that reads the mounts from a file in mountinfo format (tests give their own).
  static std::shared_ptr<KRSystemMountTable> mountTableWithMountInfoFile(std::string path);
  ~KRSystemMountTable() override;

  std::vector<KRMountEntry> mounts() const override;
  bool isMonitoring() const;

 protected:
  void startMonitoring() override;

 private:
  explicit KRSystemMountTable(std::string mountInfoPath);
  // The monitor thread: holds the table only while it notifies, so that the table may go away.
  static void watch(const std::shared_ptr<KRMountMonitor>& monitor,
                    const std::weak_ptr<KRSystemMountTable>& table);

  const std::string mountInfoPath_;
  mutable std::mutex monitorMutex_;
  bool monitoringStarted_ = false;
  std::shared_ptr<KRMountMonitor> monitor_;
  std::thread thread_;
};
