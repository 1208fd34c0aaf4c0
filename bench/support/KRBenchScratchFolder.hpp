#pragma once

#include <filesystem>
#include <string>

// A fresh folder under the temporary directory for one benchmark run's catalogs, removed with the
// object.
class KRBenchScratchFolder {
 public:
  explicit KRBenchScratchFolder(const std::string& prefix);
  ~KRBenchScratchFolder();
  KRBenchScratchFolder(const KRBenchScratchFolder&) = delete;
  KRBenchScratchFolder& operator=(const KRBenchScratchFolder&) = delete;

  const std::filesystem::path& path() const { return path_; }
  // The path of a file in the folder.
  std::string file(const std::string& name) const { return (path_ / name).string(); }

 private:
  std::filesystem::path path_;
};
