#pragma once

#include <filesystem>
#include <optional>
#include <set>
#include <vector>

#include "CrashOperation.hpp"

namespace reliability {

// What a writer's log says: the calls it began, in order, and which of them it saw return.
class LoggedHistory {
 public:
  // An empty history when there is no log; a line cut short by the writer's death is ignored.
  static LoggedHistory read(const std::filesystem::path& directory);

  const std::vector<CrashOperation>& operations() const { return operations_; }
  bool acknowledged(const CrashOperation& operation) const {
    return acknowledged_.count(operation.number) > 0;
  }
  // The last call begun, when the writer died before it returned.
  std::optional<CrashOperation> inFlight() const;

 private:
  void readLine(const std::string& line);

  std::vector<CrashOperation> operations_;
  std::set<long long> acknowledged_;
};

}  // namespace reliability
