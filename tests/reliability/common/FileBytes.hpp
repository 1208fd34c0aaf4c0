#pragma once

#include <filesystem>
#include <string>

namespace reliability {

// Whole-file reads and writes of the harnesses' fixture files.
class FileBytes {
 public:
  // Throws std::runtime_error when the file cannot be read.
  static std::string read(const std::filesystem::path& path);
  // Creates or replaces the file; throws std::runtime_error when it cannot be written.
  static void write(const std::filesystem::path& path, const std::string& bytes);
};

}  // namespace reliability
