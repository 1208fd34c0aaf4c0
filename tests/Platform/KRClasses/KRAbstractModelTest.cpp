#include "KRClasses/KRAbstractModel.hpp"

#include <gtest/gtest.h>

#include <thread>

#include "KRFoundation/KRRunLoop.hpp"
#include "KRFoundation/KRValue.hpp"

namespace {

class ChangeObserver {
 public:
  virtual ~ChangeObserver() = default;
  virtual void modelDidChange(KRAbstractModel*, const KRDictionary&) {}
  virtual void modelDidReset(KRAbstractModel*) {}
};

class Model : public KRAbstractModel {};

class Recorder : public KRObject, public ChangeObserver {
 public:
  Recorder(std::string name, std::vector<std::string>* log) : name_(std::move(name)), log_(log) {}
  void modelDidChange(KRAbstractModel* model, const KRDictionary& info) override {
    log_->push_back(name_ + ":" + info.objectForKey("key").description());
    if (onChange) onChange(model);
  }
  std::function<void(KRAbstractModel*)> onChange;

 private:
  std::string name_;
  std::vector<std::string>* log_;
};

class Bystander : public KRObject {};

bool runMainLoopUntil(const std::function<bool()>& condition) {
  return KRRunLoop::currentRunLoop()->runUntil(condition, KRDate::dateWithTimeIntervalSinceNow(5));
}

}  // namespace

TEST(KRAbstractModelTest, NotifiesObserversInRegistrationOrder) {
  std::vector<std::string> log;
  auto model = std::make_shared<Model>();
  auto b = std::make_shared<Recorder>("b", &log);
  auto a = std::make_shared<Recorder>("a", &log);
  model->addListener(b);
  model->addListener(a);
  model->notifyObserversWithSelector(&ChangeObserver::modelDidChange, model.get(), KRDictionary{{"key", 1}});
  EXPECT_EQ(log, (std::vector<std::string>{"b:1", "a:1"}));
}

TEST(KRAbstractModelTest, DuplicateRegistrationIsIgnored) {
  std::vector<std::string> log;
  auto model = std::make_shared<Model>();
  auto a = std::make_shared<Recorder>("a", &log);
  model->addListener(a);
  model->addListener(a);
  EXPECT_EQ(model->listeners().size(), 1u);
  model->notifyObserversWithSelector(&ChangeObserver::modelDidChange, model.get(), KRDictionary{{"key", 2}});
  EXPECT_EQ(log.size(), 1u);
}

TEST(KRAbstractModelTest, ObserversAreHeldWeakly) {
  std::vector<std::string> log;
  auto model = std::make_shared<Model>();
  auto a = std::make_shared<Recorder>("a", &log);
  model->addListener(a);
  a.reset();
  EXPECT_TRUE(model->listeners().empty());
  model->notifyObserversWithSelector(&ChangeObserver::modelDidChange, model.get(), KRDictionary{{"key", 3}});
  EXPECT_TRUE(log.empty());
}

TEST(KRAbstractModelTest, ObserverWithoutTheInterfaceIsSkipped) {
  std::vector<std::string> log;
  auto model = std::make_shared<Model>();
  auto bystander = std::make_shared<Bystander>();
  auto a = std::make_shared<Recorder>("a", &log);
  model->addListener(bystander);
  model->addListener(a);
  model->notifyObserversWithSelector(&ChangeObserver::modelDidChange, model.get(), KRDictionary{{"key", 4}});
  EXPECT_EQ(log, (std::vector<std::string>{"a:4"}));
}

TEST(KRAbstractModelTest, ObserverMayRemoveItselfWhileNotified) {
  std::vector<std::string> log;
  auto model = std::make_shared<Model>();
  auto a = std::make_shared<Recorder>("a", &log);
  auto b = std::make_shared<Recorder>("b", &log);
  a->onChange = [&a](KRAbstractModel* m) { m->removeListener(a); };
  model->addListener(a);
  model->addListener(b);
  model->notifyObserversWithSelector(&ChangeObserver::modelDidChange, model.get(), KRDictionary{{"key", 5}});
  model->notifyObserversWithSelector(&ChangeObserver::modelDidChange, model.get(), KRDictionary{{"key", 6}});
  EXPECT_EQ(log, (std::vector<std::string>{"a:5", "b:5", "b:6"}));
}

TEST(KRAbstractModelTest, ObserverRemovedByAnEarlierOneIsNotCalled) {
  std::vector<std::string> log;
  auto model = std::make_shared<Model>();
  auto a = std::make_shared<Recorder>("a", &log);
  auto b = std::make_shared<Recorder>("b", &log);
  a->onChange = [&b](KRAbstractModel* m) { m->removeListener(b); };
  model->addListener(a);
  model->addListener(b);
  model->notifyObserversWithSelector(&ChangeObserver::modelDidChange, model.get(), KRDictionary{{"key", 7}});
  EXPECT_EQ(log, (std::vector<std::string>{"a:7"}));
  EXPECT_FALSE(model->hasListener(b));
}

// Past a few observers the list keeps a position index; order, duplicates, removal and dead observers
// behave as for a short list.
TEST(KRAbstractModelTest, ManyObserversKeepTheirOrderAndAreFoundAndRemoved) {
  std::vector<std::string> log;
  auto model = std::make_shared<Model>();
  std::vector<std::shared_ptr<Recorder>> recorders;
  for (int index = 0; index < 40; ++index) {
    recorders.push_back(std::make_shared<Recorder>(std::to_string(index), &log));
    model->addListener(recorders.back());
    model->addListener(recorders.front());
  }
  EXPECT_EQ(model->listeners().size(), 40u);
  model->removeListener(recorders[10]);
  EXPECT_FALSE(model->hasListener(recorders[10]));
  EXPECT_TRUE(model->hasListener(recorders[11]));
  recorders[20].reset();
  model->addListener(recorders[10]);
  model->notifyObserversWithSelector(&ChangeObserver::modelDidChange, model.get(), KRDictionary{{"key", 8}});
  std::vector<std::string> expected;
  for (int index = 0; index < 40; ++index) {
    if (index != 10 && index != 20) expected.push_back(std::to_string(index) + ":8");
  }
  expected.push_back("10:8");
  EXPECT_EQ(log, expected);
}

TEST(KRAbstractModelTest, RemovingMostOfManyObserversKeepsTheRestInOrderAndTheListShort) {
  std::vector<std::string> log;
  auto model = std::make_shared<Model>();
  std::vector<std::shared_ptr<Recorder>> recorders;
  for (int index = 0; index < 1000; ++index) {
    recorders.push_back(std::make_shared<Recorder>(std::to_string(index), &log));
    model->addListener(recorders.back());
  }
  for (int index = 0; index < 1000; ++index) {
    if (index % 100 != 7) model->removeListener(recorders[static_cast<size_t>(index)]);
  }
  EXPECT_FALSE(model->hasListener(recorders[8]));
  EXPECT_TRUE(model->hasListener(recorders[907]));
  model->notifyObserversWithSelector(&ChangeObserver::modelDidChange, model.get(), KRDictionary{{"key", 1}});
  std::vector<std::string> expected;
  for (int index = 7; index < 1000; index += 100) expected.push_back(std::to_string(index) + ":1");
  EXPECT_EQ(log, expected);
  for (int index = 7; index < 1000; index += 100)
    model->removeListener(recorders[static_cast<size_t>(index)]);
  EXPECT_FALSE(model->hasListeners());
}

TEST(KRAbstractModelTest, EntriesOfDeadObserversAreDroppedAsTheListGrows) {
  auto model = std::make_shared<Model>();
  std::vector<std::string> log;
  auto kept = std::make_shared<Recorder>("kept", &log);
  model->addListener(kept);
  for (int index = 0; index < 1000; ++index) model->addListener(std::make_shared<Recorder>("gone", &log));
  EXPECT_EQ(model->listeners(), (std::vector<std::shared_ptr<KRObject>>{kept}));
  EXPECT_TRUE(model->hasListener(kept));
}

TEST(KRAbstractModelTest, NextIterationBlockRunsOnTheMainRunLoopLater) {
  auto model = std::make_shared<Model>();
  bool ran = false;
  model->performOnNextRunLoopIterationBlock(
      [&ran] { ran = true; }, {KRRunLoop::NSRunLoopCommonModes, KRRunLoop::NSDefaultRunLoopMode});
  EXPECT_FALSE(ran);
  EXPECT_TRUE(runMainLoopUntil([&ran] { return ran; }));
}

TEST(KRAbstractModelTest, MainThreadBlockRunsInlineOnTheMainThread) {
  auto model = std::make_shared<Model>();
  bool ran = false;
  model->performMainThreadBlock([&ran] { ran = true; });
  EXPECT_TRUE(ran);
}

TEST(KRAbstractModelTest, MainThreadBlockFromAnotherThreadWaitsForTheMainThread) {
  auto model = std::make_shared<Model>();
  std::thread::id ranOn;
  bool finished = false;
  std::thread worker([&] {
    model->performMainThreadBlock([&ranOn] { ranOn = std::this_thread::get_id(); });
    KRRunLoop::mainRunLoop()->performBlock([&finished] { finished = true; });
  });
  EXPECT_TRUE(runMainLoopUntil([&finished] { return finished; }));
  worker.join();
  EXPECT_EQ(ranOn, std::this_thread::get_id());
}

TEST(KRAbstractModelTest, AsyncMainThreadBlockRunsLaterEvenOnTheMainThread) {
  auto model = std::make_shared<Model>();
  std::vector<int> order;
  model->asyncPerformMainThreadBlock([&order] { order.push_back(2); });
  order.push_back(1);
  EXPECT_TRUE(runMainLoopUntil([&order] { return order.size() == 2; }));
  EXPECT_EQ(order, (std::vector<int>{1, 2}));
}

TEST(KRAbstractModelTest, AGoneOnlyObserverLeavesItsPlaceToTheNextOne) {
  std::vector<std::string> log;
  auto model = std::make_shared<Model>();
  auto gone = std::make_shared<Recorder>("gone", &log);
  model->addListener(gone);
  gone.reset();
  auto next = std::make_shared<Recorder>("next", &log);
  model->addListener(next);
  EXPECT_EQ(model->listeners(), (std::vector<std::shared_ptr<KRObject>>{next}));
  model->removeListener(next);
  EXPECT_TRUE(model->listeners().empty());
  EXPECT_FALSE(model->hasListener(next));
}

TEST(KRAbstractModelTest, ObserversKeepTheirOrderWhenTheFirstIsRemovedFromMany) {
  std::vector<std::string> log;
  auto model = std::make_shared<Model>();
  std::vector<std::shared_ptr<Recorder>> recorders;
  for (const char* name : {"a", "b", "c"}) {
    recorders.push_back(std::make_shared<Recorder>(name, &log));
    model->addListener(recorders.back());
  }
  model->removeListener(recorders[0]);
  model->addListener(recorders[0]);
  model->notifyObserversWithSelector(&ChangeObserver::modelDidChange, model.get(), KRDictionary{{"key", 7}});
  EXPECT_EQ(log, (std::vector<std::string>{"b:7", "c:7", "a:7"}));
}

TEST(KRAbstractModelTest, HasListenersWhileAnyIsRegistered) {
  std::vector<std::string> log;
  auto model = std::make_shared<Model>();
  EXPECT_FALSE(model->hasListeners());
  auto a = std::make_shared<Recorder>("a", &log);
  auto b = std::make_shared<Recorder>("b", &log);
  model->addListener(a);
  EXPECT_TRUE(model->hasListeners());
  model->addListener(b);
  model->removeListener(a);
  EXPECT_TRUE(model->hasListeners());
  model->removeListener(b);
  EXPECT_FALSE(model->hasListeners());
}
