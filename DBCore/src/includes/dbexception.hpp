#pragma once

#include <cstdint>
#include <exception>
#include <string>

namespace dbcore {

// The engine's failure: a description and a signed 32-bit code (SQLite's extended result code where
// the failure came from SQLite), -1 when there is no code.
class DBException : public std::exception {
 public:
  static constexpr int32_t kNoCode = -1;

  explicit DBException(std::string description, int32_t code = kNoCode)
      : description_(std::move(description)), code_(code) {}

  const char* what() const noexcept override { return description_.c_str(); }
  int32_t code() const noexcept { return code_; }

 private:
  std::string description_;
  int32_t code_;
};

}  // namespace dbcore
