#include "SidecarCases.hpp"

#include <random>

#include "CaseFiles.hpp"
#include "FileBytes.hpp"

namespace reliability {

namespace {

constexpr size_t kWalHeaderSize = 32;
constexpr size_t kShmSize = 32768;

}  // namespace

std::vector<HostileCase> SidecarCases::make(const HostileSources& sources, uint64_t seed) {
  std::mt19937_64 random(seed);
  const std::string garbageWal =
      CaseFiles::randomBytes(random, kWalHeaderSize + 3 * (sources.pageSize() + 24));
  const std::string garbageShm = CaseFiles::randomBytes(random, kShmSize);
  const std::string& hotJournal = sources.otherDatabaseHotJournal();
  return {
      beside(sources, "committed -wal of another catalog beside a catalog",
             {{"-wal", sources.foreignCatalogWal()}}, {0, 2}),
      beside(sources, "committed -wal of another application's database beside a catalog",
             {{"-wal", sources.otherDatabaseWal()}}, {0, 2}),
      beside(sources, "garbage -wal beside a catalog", {{"-wal", garbageWal}}, {0, 2}),
      beside(sources, "garbage -shm beside a catalog", {{"-shm", garbageShm}}, {0, 2}),
      beside(sources, "garbage -wal and -shm beside a catalog", {{"-wal", garbageWal}, {"-shm", garbageShm}},
             {0, 2}),
      beside(sources, "empty -wal beside a catalog", {{"-wal", ""}}, {0}),
      beside(sources, "hot journal of another database beside a catalog", {{"-journal", hotJournal}}, {0, 2}),
      beside(sources, "hot journal of another database beside a rollback-journal catalog",
             {{"-journal", hotJournal}}, {0, 2}, true),
  };
}

HostileCase SidecarCases::beside(const HostileSources& sources, const std::string& name,
                                 const Sidecars& sidecars, const std::set<int>& answers,
                                 bool rollbackJournal) {
  const auto prepare = [&sources, sidecars, rollbackJournal](const std::filesystem::path& folder) {
    CaseFiles::writeCatalog(folder, sources.catalog());
    if (rollbackJournal) CaseFiles::editCatalog(folder, "PRAGMA journal_mode = DELETE");
    for (const auto& [suffix, bytes] : sidecars) FileBytes::write(CaseFiles::sidecar(folder, suffix), bytes);
  };
  return HostileCase{name, prepare, answers, true};
}

}  // namespace reliability
