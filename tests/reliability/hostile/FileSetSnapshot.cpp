#include "FileSetSnapshot.hpp"

#include "FileBytes.hpp"

namespace reliability {

FileSetSnapshot FileSetSnapshot::of(const std::filesystem::path& folder) {
  FileSetSnapshot snapshot;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(folder)) {
    if (entry.is_regular_file())
      snapshot.files_[std::filesystem::relative(entry.path(), folder).string()] =
          FileBytes::read(entry.path());
  }
  return snapshot;
}

std::optional<std::string> FileSetSnapshot::file(const std::string& name) const {
  const auto found = files_.find(name);
  if (found == files_.end()) return std::nullopt;
  return found->second;
}

std::vector<std::string> FileSetSnapshot::differences(const FileSetSnapshot& later) const {
  std::vector<std::string> changes;
  for (const auto& [name, bytes] : files_) {
    const auto after = later.file(name);
    if (!after) {
      changes.push_back("deleted " + name);
    } else if (*after != bytes) {
      changes.push_back("changed " + name);
    }
  }
  for (const auto& entry : later.files_)
    if (!files_.count(entry.first)) changes.push_back("created " + entry.first);
  return changes;
}

}  // namespace reliability
