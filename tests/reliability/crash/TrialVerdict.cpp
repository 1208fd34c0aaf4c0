#include "TrialVerdict.hpp"

namespace reliability {

void TrialVerdict::addIntegrityFailure(const std::string& problem) {
  ++integrityFailures;
  problems.push_back("integrity failure: " + problem);
}

void TrialVerdict::addLostWrite(const std::string& problem) {
  ++lostWrites;
  problems.push_back("lost acknowledged write: " + problem);
}

void TrialVerdict::addPartialCall(const std::string& problem) {
  ++partialCalls;
  problems.push_back("partial call: " + problem);
}

void TrialVerdict::add(const TrialVerdict& other) {
  integrityFailures += other.integrityFailures;
  lostWrites += other.lostWrites;
  partialCalls += other.partialCalls;
  problems.insert(problems.end(), other.problems.begin(), other.problems.end());
}

}  // namespace reliability
