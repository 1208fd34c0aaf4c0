#pragma once

#include <filesystem>
#include <string>

#include "FileSetSnapshot.hpp"

namespace reliability {

// Whether a case's catalog file is a sound SQLite database, and what it holds. Judged with plain SQLite on
// copies in a scratch folder, so that SQLite's own recovery never touches the case's files.
class CatalogHealth {
 public:
  // The catalog file of the snapshot, alone or with the sidecars beside it.
  static CatalogHealth of(const FileSetSnapshot& files, const std::filesystem::path& scratch,
                          bool withSidecars);

  bool exists() const { return exists_; }
  bool sound() const { return exists_ && problems_.empty(); }
  const std::string& problems() const { return problems_; }
  // The content text of RawDatabase::contentText; empty when unreadable.
  const std::string& content() const { return content_; }

 private:
  void inspect(const std::filesystem::path& file);

  bool exists_ = false;
  std::string problems_;
  std::string content_;
};

}  // namespace reliability
