#include "KRFoundation/KRDispatchQueue.hpp"

#include <cstdio>
#include <mutex>

#include "KRFoundation/KRBlockWaiter.hpp"

namespace {

// The handler of every queue. Never destroyed, so workers still running at exit can report.
struct HandlerSlot {
  std::mutex mutex;
  KRDispatchQueue::UncaughtExceptionHandler handler;
};

HandlerSlot& handlerSlot() {
  static HandlerSlot& slot = *new HandlerSlot;
  return slot;
}

std::string describe(const std::exception_ptr& error) {
  try {
    std::rethrow_exception(error);
  } catch (const std::exception& exception) {
    return exception.what();
  } catch (...) {
    return "unknown exception";
  }
}

void writeToStandardError(const std::string& label, const std::exception_ptr& error) {
  const std::string line = "uncaught exception on queue " + label + ": " + describe(error) + "\n";
  std::fputs(line.c_str(), stderr);
}

// The worker data of the queue whose block runs on this thread.
thread_local const void* tCurrentWorker = nullptr;

}  // namespace

KRDispatchQueue::KRDispatchQueue(std::string label)
    : worker_(std::make_shared<Worker>(std::move(label))), thread_([worker = worker_] { work(worker); }) {}

std::shared_ptr<KRDispatchQueue> KRDispatchQueue::serialQueue(std::string label) {
  return std::shared_ptr<KRDispatchQueue>(new KRDispatchQueue(std::move(label)));
}

KRDispatchQueue::~KRDispatchQueue() {
  worker_->blocks.close();
  if (isCurrent()) {
    thread_.detach();
  } else {
    thread_.join();
  }
}

const std::string& KRDispatchQueue::label() const { return worker_->label; }

void KRDispatchQueue::async(std::function<void()> block) { worker_->blocks.push(std::move(block)); }

void KRDispatchQueue::sync(const std::function<void()>& block) {
  if (isCurrent()) {
    block();
    return;
  }
  KRBlockWaiter::postAndWait([this](std::function<void()> wrapper) { async(std::move(wrapper)); }, block);
}

bool KRDispatchQueue::isCurrent() const { return tCurrentWorker == worker_.get(); }

void KRDispatchQueue::setUncaughtExceptionHandler(UncaughtExceptionHandler handler) {
  HandlerSlot& slot = handlerSlot();
  std::lock_guard lock(slot.mutex);
  slot.handler = std::move(handler);
}

void KRDispatchQueue::reportUncaughtException(const std::string& label, std::exception_ptr error) {
  UncaughtExceptionHandler handler;
  {
    HandlerSlot& slot = handlerSlot();
    std::lock_guard lock(slot.mutex);
    handler = slot.handler;
  }
  if (!handler) {
    writeToStandardError(label, error);
    return;
  }
  try {
    handler(label, error);
  } catch (...) {
    writeToStandardError(label, error);
  }
}

void KRDispatchQueue::work(const std::shared_ptr<Worker>& worker) {
  tCurrentWorker = worker.get();
  worker->blocks.runUntilClosed(
      [&worker](std::exception_ptr error) { reportUncaughtException(worker->label, std::move(error)); });
}
