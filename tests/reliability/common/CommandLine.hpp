#pragma once

#include <optional>
#include <string>
#include <vector>

namespace reliability {

// The options of a harness: "--name value" pairs and "--name" flags. Each option is read once; an
// argument nobody read is an error.
class CommandLine {
 public:
  CommandLine(int argc, char** argv);

  // The value after the option, if it is given; throws std::invalid_argument when the value is missing.
  std::optional<std::string> value(const std::string& name);
  std::optional<long long> integer(const std::string& name);
  bool flag(const std::string& name);
  // Throws std::invalid_argument naming the first argument no option read.
  void requireAllRead() const;

 private:
  std::vector<std::string> arguments_;
  std::vector<bool> read_;
};

}  // namespace reliability
