// Costs of the catalog's operation dispatch: a guarded synchronous round trip to the catalog's queue
// against a bare handoff of a closure to a worker thread, and asynchronous operations whose handlers
// come back on the main run loop.
#include <condition_variable>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <mutex>
#include <string>
#include <thread>

#include "KRBenchSqlite.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

constexpr int kRoundTrips = 100000;
constexpr int kAsyncOperations = 100000;
constexpr int kRuns = 3;

// The baseline: one worker thread that runs one closure at a time, handed over under a mutex and waited
// for on a condition variable.
class RawWorker {
 public:
  RawWorker() : thread_([this] { work(); }) {}
  ~RawWorker() {
    {
      std::lock_guard lock(mutex_);
      stopping_ = true;
    }
    wake_.notify_all();
    thread_.join();
  }

  void runAndWait(std::function<void()> job) {
    std::unique_lock lock(mutex_);
    job_ = std::move(job);
    wake_.notify_all();
    finished_.wait(lock, [this] { return !job_; });
  }

 private:
  void work() {
    std::unique_lock lock(mutex_);
    while (true) {
      wake_.wait(lock, [this] { return stopping_ || job_; });
      if (stopping_) return;
      job_();
      job_ = nullptr;
      finished_.notify_all();
    }
  }

  std::mutex mutex_;
  std::condition_variable wake_;
  std::condition_variable finished_;
  std::function<void()> job_;
  bool stopping_ = false;
  std::thread thread_;
};

template <class Body>
double bestOf(Body&& body) {
  double best = 1e9;
  for (int run = 0; run < kRuns; ++run) best = std::min(best, KRBenchSqlite::timed(body));
  return best;
}

double rawRoundTrips() {
  RawWorker worker;
  long counter = 0;
  return bestOf([&] {
    for (int index = 0; index < kRoundTrips; ++index) worker.runAndWait([&counter] { ++counter; });
  });
}

double catalogRoundTrips(KRDBCatalog& catalog) {
  long counter = 0;
  const KRDBCatalog::ReactorBlock noOperation = [&counter](const KRDBCatalog::Reactor&) { ++counter; };
  return bestOf([&] {
    for (int index = 0; index < kRoundTrips; ++index) {
      catalog.performSynchronously(true, [&] { catalog.handleDBReactorBlock(noOperation, "bench", true); });
    }
  });
}

double asynchronousOperations(KRDBCatalog& catalog) {
  return bestOf([&] {
    int delivered = 0;
    for (int index = 0; index < kAsyncOperations; ++index) {
      catalog.performOperation<int>([index](KRDBCatalog&) { return index; },
                                    [&delivered](int) { ++delivered; }, false);
    }
    const bool done = KRRunLoop::mainRunLoop()->runUntil([&] { return delivered == kAsyncOperations; },
                                                         KRDate::dateWithTimeIntervalSinceNow(120));
    if (!done) std::abort();
  });
}

}  // namespace

int main() {
  KRRunLoop::designateMainThread();
  KRTemporaryDirectory directory;
  const auto catalog = KRDBCatalog::initWithContentsOfFile(directory.file("bench.krcatalog"), nullptr);
  if (!catalog) return 1;
  catalog->initializeAndUpdateIfNeaded();

  const double raw = rawRoundTrips();
  const double ours = catalogRoundTrips(*catalog);
  std::printf("RAW_ROUNDTRIP_NS %.0f\nCATALOG_ROUNDTRIP_NS %.0f\n", raw / kRoundTrips * 1e9,
              ours / kRoundTrips * 1e9);
  std::printf("RATIO catalog_sync_roundtrip %.3f\n", raw / ours);
  std::printf("ASYNC_OPS_PER_S %.0f\n", kAsyncOperations / asynchronousOperations(*catalog));
  return 0;
}
