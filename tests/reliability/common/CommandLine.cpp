#include "CommandLine.hpp"

#include <algorithm>
#include <stdexcept>

namespace reliability {

CommandLine::CommandLine(int argc, char** argv)
    : arguments_(argv + 1, argv + argc), read_(arguments_.size(), false) {}

std::optional<std::string> CommandLine::value(const std::string& name) {
  const auto found = std::find(arguments_.begin(), arguments_.end(), name);
  if (found == arguments_.end()) return std::nullopt;
  const auto index = static_cast<size_t>(found - arguments_.begin());
  if (index + 1 >= arguments_.size()) throw std::invalid_argument(name + " needs a value");
  read_[index] = read_[index + 1] = true;
  return arguments_[index + 1];
}

std::optional<long long> CommandLine::integer(const std::string& name) {
  const auto text = value(name);
  if (!text) return std::nullopt;
  size_t used = 0;
  const long long number = std::stoll(*text, &used);
  if (used != text->size()) throw std::invalid_argument(name + " needs a number");
  return number;
}

bool CommandLine::flag(const std::string& name) {
  const auto found = std::find(arguments_.begin(), arguments_.end(), name);
  if (found == arguments_.end()) return false;
  read_[static_cast<size_t>(found - arguments_.begin())] = true;
  return true;
}

void CommandLine::requireAllRead() const {
  for (size_t index = 0; index < arguments_.size(); ++index)
    if (!read_[index]) throw std::invalid_argument("unknown argument " + arguments_[index]);
}

}  // namespace reliability
