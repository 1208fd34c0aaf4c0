#pragma once

#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace reliability {

// The full bytes of every file in a folder and below it, by relative path.
class FileSetSnapshot {
 public:
  static FileSetSnapshot of(const std::filesystem::path& folder);

  std::optional<std::string> file(const std::string& name) const;
  // What differs in `later`: "created X", "deleted X", "changed X"; empty when nothing does.
  std::vector<std::string> differences(const FileSetSnapshot& later) const;

 private:
  std::map<std::string, std::string> files_;
};

}  // namespace reliability
