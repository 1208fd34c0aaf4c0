#pragma once

#include <filesystem>
#include <string>

// A fresh directory under the system's temporary folder, removed with its contents on destruction.
class KRTemporaryDirectory {
 public:
  KRTemporaryDirectory();
  ~KRTemporaryDirectory();
  KRTemporaryDirectory(const KRTemporaryDirectory&) = delete;
  KRTemporaryDirectory& operator=(const KRTemporaryDirectory&) = delete;

  const std::filesystem::path& path() const { return path_; }
  // The path of a file in the directory.
  std::string file(const std::string& name) const { return (path_ / name).string(); }

 private:
  std::filesystem::path path_;
};
