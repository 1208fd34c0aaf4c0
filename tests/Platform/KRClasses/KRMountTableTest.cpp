#include "KRClasses/KRMountTable.hpp"

#include <gtest/gtest.h>

#include <functional>
#include <string>

#include "KRClasses/KRSystemMountTable.hpp"
#include "support/KRFakeMountTable.hpp"

namespace {

KRMountEntry mountAt(std::string mountPoint) {
  return {.mountPoint = std::move(mountPoint), .device = "tmpfs"};
}

// Records, per delivery, the mount points it was given, prefixed with its name.
class MountsRecorder : public KRMountTableObserver {
 public:
  MountsRecorder(std::string name, std::vector<std::string>* log) : name_(std::move(name)), log_(log) {}
  void mountTableDidChange(const std::vector<KRMountEntry>& mounts) override {
    std::string line = name_ + ":";
    for (const auto& entry : mounts) line += " " + entry.mountPoint;
    log_->push_back(line);
    if (onChange) onChange();
  }
  std::function<void()> onChange;

 private:
  std::string name_;
  std::vector<std::string>* log_;
};

using Log = std::vector<std::string>;

}  // namespace

TEST(KRMountTableTest, ObserverGetsTheCurrentMountsWhenAdded) {
  Log log;
  const auto table = KRFakeMountTable::create({mountAt("/"), mountAt("/data")});
  table->addObserver(std::make_shared<MountsRecorder>("a", &log));
  EXPECT_EQ(log, Log{"a: / /data"});
}

TEST(KRMountTableTest, ObserversHearOfChangesInRegistrationOrder) {
  Log log;
  const auto table = KRFakeMountTable::create({mountAt("/")});
  const auto second = std::make_shared<MountsRecorder>("b", &log);
  const auto first = std::make_shared<MountsRecorder>("a", &log);
  table->addObserver(second);
  table->addObserver(first);
  log.clear();
  table->setMounts({mountAt("/"), mountAt("/usb")});
  EXPECT_EQ(log, (Log{"b: / /usb", "a: / /usb"}));
  EXPECT_EQ(table->observerCount(), 2u);
}

TEST(KRMountTableTest, ObserversAreHeldWeakly) {
  Log log;
  const auto table = KRFakeMountTable::create();
  auto observer = std::make_shared<MountsRecorder>("a", &log);
  table->addObserver(observer);
  observer.reset();
  EXPECT_EQ(table->observerCount(), 0u);
  table->setMounts({mountAt("/")});
  EXPECT_EQ(log, Log{"a:"});
}

TEST(KRMountTableTest, RemovedObserverHearsNothing) {
  Log log;
  const auto table = KRFakeMountTable::create();
  const auto observer = std::make_shared<MountsRecorder>("a", &log);
  table->addObserver(observer);
  table->removeObserver(observer.get());
  table->setMounts({mountAt("/")});
  EXPECT_EQ(log, Log{"a:"});
  EXPECT_EQ(table->observerCount(), 0u);
}

TEST(KRMountTableTest, ObserverMayLeaveWhileBeingNotified) {
  Log log;
  const auto table = KRFakeMountTable::create();
  const auto leaving = std::make_shared<MountsRecorder>("a", &log);
  const auto staying = std::make_shared<MountsRecorder>("b", &log);
  table->addObserver(leaving);
  table->addObserver(staying);
  leaving->onChange = [&] { table->removeObserver(leaving.get()); };
  log.clear();
  table->setMounts({mountAt("/")});
  table->setMounts({mountAt("/"), mountAt("/usb")});
  EXPECT_EQ(log, (Log{"a: /", "b: /", "b: / /usb"}));
}

TEST(KRMountTableTest, ObserverMayRegisterAnotherWhileBeingNotified) {
  Log log;
  const auto table = KRFakeMountTable::create();
  const auto first = std::make_shared<MountsRecorder>("a", &log);
  const auto late = std::make_shared<MountsRecorder>("b", &log);
  table->addObserver(first);
  first->onChange = [&] { table->addObserver(late); };
  log.clear();
  table->setMounts({mountAt("/")});
  EXPECT_EQ(log, (Log{"a: /", "b: /"}));
  EXPECT_EQ(table->observerCount(), 2u);
}

TEST(KRMountTableTest, DefaultMountTableIsTheSharedSystemTable) {
  const auto table = KRMountTable::defaultMountTable();
  EXPECT_EQ(table, KRSystemMountTable::sharedMountTable());
  EXPECT_NE(std::dynamic_pointer_cast<KRSystemMountTable>(table), nullptr);
}
