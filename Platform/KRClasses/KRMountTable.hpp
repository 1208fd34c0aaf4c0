#pragma once

#include <cstddef>
#include <memory>
#include <mutex>
#include <vector>

#include "KRClasses/KRMountEntry.hpp"
#include "KRClasses/KRMountTableObserver.hpp"
#include "KRFoundation/KRObject.hpp"

// A source of the mounted file systems, held by std::shared_ptr, with a list of weakly held observers.
// Implementations list their mounts and call notifyObservers() when the list changed.
//
// Deliveries are serialised: an observer gets the mounts of the moment it registers before any later
// change, and never two lists at once.
class KRMountTable : public KRObject {
 public:
  // The process-wide system mount table (shared while anyone holds it).
  static std::shared_ptr<KRMountTable> defaultMountTable();

  // The mounts in table order (a mount stacked over another comes after it).
  virtual std::vector<KRMountEntry> mounts() const = 0;

  // Registers the observer (held weakly) and hands it the current mounts on the calling thread.
  void addObserver(const std::shared_ptr<KRMountTableObserver>& observer);
  // Drops the observer; safe to call from the observer's destructor, on any thread.
  void removeObserver(const KRMountTableObserver* observer);
  // The number of registered observers that are still alive.
  size_t observerCount() const;

 protected:
  KRMountTable() = default;

  // Reads the mounts once and hands them to every live observer, in registration order.
  void notifyObservers();
  // Called before each registration, so that an implementation can start watching for changes.
  virtual void startMonitoring() {}

 private:
  struct Registration {
    const KRMountTableObserver* address;
    std::weak_ptr<KRMountTableObserver> observer;
  };
  std::vector<std::shared_ptr<KRMountTableObserver>> liveObservers() const;

  // Serialises deliveries; held while observers are called. Recursive, so that an observer may
  // register another one while being notified.
  std::recursive_mutex deliveryMutex_;
  // Guards the registrations only, so that an observer may unregister while being called.
  mutable std::mutex observersMutex_;
  std::vector<Registration> registrations_;
};
