#pragma once

#include <memory>
#include <mutex>
#include <vector>

#include "KRClasses/KRMountTable.hpp"

// An in-memory mount table for tests: the test sets the mounts, and the observers hear of it on the
// thread that set them (a background thread plays the system's monitor thread).
class KRFakeMountTable : public KRMountTable {
 public:
  static std::shared_ptr<KRFakeMountTable> create(std::vector<KRMountEntry> mounts = {});

  std::vector<KRMountEntry> mounts() const override;
  // Replaces the mounts and notifies the observers.
  void setMounts(std::vector<KRMountEntry> mounts);

 private:
  explicit KRFakeMountTable(std::vector<KRMountEntry> mounts);

  mutable std::mutex mutex_;
  std::vector<KRMountEntry> mounts_;
};
