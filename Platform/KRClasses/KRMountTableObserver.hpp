#pragma once

#include <vector>

#include "KRClasses/KRMountEntry.hpp"

// Receives the mounts of a KRMountTable: once when registered, then after every change. Called on the
// thread that registers or that noticed the change (for the system table, its monitor thread).
class KRMountTableObserver {
 public:
  virtual ~KRMountTableObserver() = default;
  virtual void mountTableDidChange(const std::vector<KRMountEntry>&) {}
};
