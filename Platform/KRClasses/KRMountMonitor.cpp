#include "KRClasses/KRMountMonitor.hpp"

#include <libmount/libmount.h>
#include <poll.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdint>

std::shared_ptr<KRMountMonitor> KRMountMonitor::create() {
  libmnt_monitor* monitor = mnt_new_monitor();
  if (!monitor) return nullptr;
  const int stopDescriptor = eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK);
  if (stopDescriptor < 0 || mnt_monitor_enable_kernel(monitor, 1) != 0 || mnt_monitor_get_fd(monitor) < 0) {
    if (stopDescriptor >= 0) close(stopDescriptor);
    mnt_unref_monitor(monitor);
    return nullptr;
  }
  return std::shared_ptr<KRMountMonitor>(new KRMountMonitor(monitor, stopDescriptor));
}

KRMountMonitor::KRMountMonitor(libmnt_monitor* monitor, int stopDescriptor)
    : monitor_(monitor), stopDescriptor_(stopDescriptor) {}

KRMountMonitor::~KRMountMonitor() {
  mnt_unref_monitor(monitor_);
  close(stopDescriptor_);
}

bool KRMountMonitor::waitForChange() {
  std::array<pollfd, 2> descriptors{
      {{stopDescriptor_, POLLIN, 0}, {mnt_monitor_get_fd(monitor_), POLLIN, 0}}};
  while (true) {
    if (poll(descriptors.data(), descriptors.size(), -1) < 0) {
      if (errno == EINTR) continue;
      return false;
    }
    // The stop signal is never consumed, so that every later wait ends at once too.
    if (descriptors[0].revents != 0) return false;
    if (descriptors[1].revents != 0) break;
  }
  consumeChanges();
  return true;
}

void KRMountMonitor::stop() {
  const uint64_t one = 1;
  [[maybe_unused]] const ssize_t written = write(stopDescriptor_, &one, sizeof one);
}

void KRMountMonitor::consumeChanges() {
  const char* file = nullptr;
  int type = 0;
  while (mnt_monitor_next_change(monitor_, &file, &type) == 0) {
  }
}
