#include "support/KRTemporaryDirectory.hpp"

#include <cstdlib>
#include <stdexcept>
#include <system_error>

KRTemporaryDirectory::KRTemporaryDirectory() {
  std::string pattern = (std::filesystem::temp_directory_path() / "krtest-XXXXXX").string();
  if (!mkdtemp(pattern.data())) throw std::runtime_error("cannot make a temporary directory");
  path_ = pattern;
}

KRTemporaryDirectory::~KRTemporaryDirectory() {
  std::error_code ignored;
  std::filesystem::permissions(path_, std::filesystem::perms::owner_all, ignored);
  std::filesystem::remove_all(path_, ignored);
}
