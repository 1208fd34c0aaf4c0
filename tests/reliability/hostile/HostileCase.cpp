#include "HostileCase.hpp"

#include <utility>

#include "CaseFiles.hpp"

namespace reliability {

HostileCase::HostileCase(std::string name, Prepare prepare, std::set<int> documentedAnswers,
                         bool foreignSidecar, OpenPath openPath)
    : name(std::move(name)),
      prepare(std::move(prepare)),
      documentedAnswers(std::move(documentedAnswers)),
      foreignSidecar(foreignSidecar),
      openPath(std::move(openPath)) {}

std::wstring HostileCase::pathIn(const std::filesystem::path& folder) const {
  return openPath ? openPath(folder) : CaseFiles::catalog(folder).wstring();
}

}  // namespace reliability
