#pragma once

#include <memory>

struct libmnt_monitor;

// Waits for changes of the kernel mount table with libmount's monitor. One thread waits; any thread may
// stop it. Held by std::shared_ptr so that the waiting thread can keep it alive on its own.
class KRMountMonitor {
 public:
  // Nil when the kernel mount table cannot be watched (no /proc, no file descriptors left).
  static std::shared_ptr<KRMountMonitor> create();
  ~KRMountMonitor();
  KRMountMonitor(const KRMountMonitor&) = delete;
  KRMountMonitor& operator=(const KRMountMonitor&) = delete;

  // Blocks until the mount table changed (true) or stop() was called (false). Several changes that
  // arrive together count as one.
  bool waitForChange();
  // Thread-safe: makes the current and every later waitForChange() return false at once.
  void stop();

 private:
  KRMountMonitor(libmnt_monitor* monitor, int stopDescriptor);
  void consumeChanges();

  libmnt_monitor* monitor_;
  int stopDescriptor_;
};
