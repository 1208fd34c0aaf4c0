#include "KRBenchScratchFolder.hpp"

#include <cstdlib>
#include <system_error>

KRBenchScratchFolder::KRBenchScratchFolder(const std::string& prefix) {
  std::string pattern = (std::filesystem::temp_directory_path() / (prefix + "-XXXXXX")).string();
  if (!mkdtemp(pattern.data())) std::abort();
  path_ = pattern;
}

KRBenchScratchFolder::~KRBenchScratchFolder() {
  std::error_code ignored;
  std::filesystem::remove_all(path_, ignored);
}
