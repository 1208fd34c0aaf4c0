// Costs of the platform pieces on the hot paths of the catalog: queue round trips, value lookups
// and string conversions.
#include <benchmark/benchmark.h>

#include "KRClasses/KRBlockDispatcher.hpp"
#include "KRFoundation/KRConcurrentQueue.hpp"
#include "KRFoundation/KRValue.hpp"

static void BM_DispatcherWaitRoundTrip(benchmark::State& state) {
  auto dispatcher =
      KRBlockDispatcher::initWithDispatchQueue(KRDispatchQueue::serialQueue("bench.dispatcher"));
  long counter = 0;
  for (auto _ : state) dispatcher->performBlockAndWait([&counter] { ++counter; });
  benchmark::DoNotOptimize(counter);
}
BENCHMARK(BM_DispatcherWaitRoundTrip);

static void BM_DictionaryLookup(benchmark::State& state) {
  std::vector<KRDictionary::Entry> entries;
  for (int i = 0; i < 64; ++i) entries.emplace_back("key" + std::to_string(i), i);
  const KRDictionary dictionary(entries);
  const KRValue key("key42");
  for (auto _ : state) benchmark::DoNotOptimize(dictionary.objectForKey(key));
}
BENCHMARK(BM_DictionaryLookup);

static void BM_WideStringRoundTrip(benchmark::State& state) {
  const KRString path("/Volumes/Photos/2026/Île-de-France/IMG_0042.CR3");
  for (auto _ : state) benchmark::DoNotOptimize(KRString::krs_stringWithWString(path.krs_wstring()));
}
BENCHMARK(BM_WideStringRoundTrip);

static void BM_ParallelApply(benchmark::State& state) {
  std::vector<double> values(100000, 1.5);
  for (auto _ : state) {
    KRConcurrentQueue::globalQueue().apply(values.size(),
                                           [&values](size_t i) { values[i] = values[i] * 1.0001; });
  }
  benchmark::DoNotOptimize(values.data());
}
BENCHMARK(BM_ParallelApply);

BENCHMARK_MAIN();
