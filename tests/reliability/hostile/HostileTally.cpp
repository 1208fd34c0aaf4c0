#include "HostileTally.hpp"

namespace reliability {

void HostileTally::add(const HostileVerdict& verdict) {
  ++cases_;
  crashes_ += verdict.crash;
  hangs_ += verdict.hang;
  foreignExceptions_ += verdict.foreignException;
  refusedFilesChanged_ += verdict.refusedFileChanged;
  intactFilesCorrupted_ += verdict.intactFileCorrupted;
}

bool HostileTally::failed() const {
  return crashes_ + hangs_ + foreignExceptions_ + refusedFilesChanged_ + intactFilesCorrupted_ > 0;
}

std::string HostileTally::summary() const {
  return "hostile files: " + std::to_string(cases_) + " cases, " + std::to_string(crashes_) + " crashes, " +
         std::to_string(hangs_) + " hangs, " + std::to_string(foreignExceptions_) + " foreign exceptions, " +
         std::to_string(refusedFilesChanged_) + " refused files changed, " +
         std::to_string(intactFilesCorrupted_) + " intact files corrupted";
}

}  // namespace reliability
