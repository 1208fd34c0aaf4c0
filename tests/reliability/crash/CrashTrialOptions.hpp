#pragma once

#include <cstdint>

namespace reliability {

// How many crash trials to run and how: trial t uses a seed derived from `seed` and t, so that
// --seed S --first-trial T --trials 1 replays it.
struct CrashTrialOptions {
  uint64_t seed = 0;
  long long firstTrial = 0;
  // 0: no limit.
  long long trials = 100;
  // 0: no limit; otherwise no trial starts after this many seconds.
  long long seconds = 0;
  // The writer is killed after a delay drawn from 0 to this many milliseconds.
  long long maxDelayMs = 300;
};

}  // namespace reliability
