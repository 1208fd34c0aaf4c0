#include "DamageCases.hpp"

#include <array>

#include "CaseFiles.hpp"

namespace reliability {

namespace {

struct HeaderByte {
  size_t offset;
  const char* field;
  std::set<int> answers;
};

// One byte of each header field (both ends of the multi-byte ones that matter). Damage SQLite cannot see
// past may leave a usable file; a damaged identity is another application's or version's file.
const std::vector<HeaderByte>& headerBytes() {
  static const std::vector<HeaderByte> bytes{
      {0, "magic", {2}},
      {15, "magic", {2}},
      {16, "page size", {2}},
      {17, "page size", {2}},
      {18, "write version", {0, 2}},
      {19, "read version", {2}},
      {20, "reserved bytes per page", {0, 2}},
      {21, "maximum payload fraction", {0, 2}},
      {22, "minimum payload fraction", {0, 2}},
      {23, "leaf payload fraction", {0, 2}},
      {24, "change counter", {0, 2}},
      {28, "page count", {0, 2}},
      {31, "page count", {0, 2}},
      {32, "first freelist page", {0, 2}},
      {36, "freelist page count", {0, 2}},
      {40, "schema cookie", {0, 2}},
      {44, "schema format", {0, 2}},
      {47, "schema format", {0, 2}},
      {48, "page cache size", {0, 2}},
      {52, "largest root page", {0, 2}},
      {56, "text encoding", {0, 2}},
      {59, "text encoding", {0, 2}},
      {60, "user_version", {3}},
      {63, "user_version", {3}},
      {64, "incremental vacuum", {0, 2}},
      {68, "application_id", {3}},
      {71, "application_id", {3}},
      {72, "reserved", {0, 2}},
      {91, "reserved", {0, 2}},
      {92, "version-valid-for", {0, 2}},
      {96, "SQLite version", {0, 2}},
  };
  return bytes;
}

constexpr size_t kPageFlips = 12;
constexpr std::array<size_t, 3> kFlipLengths{1, 8, 64};

}  // namespace

std::vector<HostileCase> DamageCases::make(const HostileSources& sources, uint64_t seed) {
  std::mt19937_64 random(seed);
  std::vector<HostileCase> cases = headerFlips(sources);
  for (auto& pageCase : pageFlips(sources, random)) cases.push_back(std::move(pageCase));
  for (auto& cut : truncations(sources)) cases.push_back(std::move(cut));
  return cases;
}

std::vector<HostileCase> DamageCases::headerFlips(const HostileSources& sources) {
  std::vector<HostileCase> cases;
  for (const auto& byte : headerBytes()) {
    const std::string name = "header byte " + std::to_string(byte.offset) + " (" + byte.field + ") flipped";
    cases.push_back(flipped(sources, name, byte.offset, 1, byte.answers));
  }
  return cases;
}

// Bursts of 1, 8 or 64 bytes in random pages; in page 1 only past the header.
std::vector<HostileCase> DamageCases::pageFlips(const HostileSources& sources, std::mt19937_64& random) {
  const size_t pageSize = sources.pageSize();
  const size_t pages = sources.catalog().size() / pageSize;
  std::vector<HostileCase> cases;
  for (size_t index = 0; index < kPageFlips; ++index) {
    const size_t length = kFlipLengths[index % kFlipLengths.size()];
    const size_t page = random() % pages;
    const size_t first = page == 0 ? 100 : 0;
    const size_t offset = page * pageSize + first + random() % (pageSize - first - length);
    const std::string name = "page " + std::to_string(page + 1) + ": " + std::to_string(length) +
                             " bytes flipped at offset " + std::to_string(offset);
    cases.push_back(flipped(sources, name, offset, length, {0, 2}));
  }
  return cases;
}

std::vector<HostileCase> DamageCases::truncations(const HostileSources& sources) {
  const size_t size = sources.catalog().size();
  const size_t pageSize = sources.pageSize();
  std::vector<HostileCase> cases;
  for (size_t cut = 0; cut < 100; ++cut) cases.push_back(truncated(sources, cut));
  for (size_t cut : {size_t{100}, size_t{512}, pageSize - 1, pageSize, pageSize + 1, 2 * pageSize,
                     size / 2 / pageSize * pageSize, size / 2 + 123, size - pageSize, size - 1})
    cases.push_back(truncated(sources, cut));
  return cases;
}

HostileCase DamageCases::flipped(const HostileSources& sources, const std::string& name, size_t offset,
                                 size_t length, const std::set<int>& answers) {
  const auto prepare = [&sources, offset, length](const std::filesystem::path& folder) {
    std::string bytes = sources.catalog();
    for (size_t index = offset; index < offset + length; ++index)
      bytes[index] = static_cast<char>(~bytes[index]);
    CaseFiles::writeCatalog(folder, bytes);
  };
  return HostileCase{name, prepare, answers};
}

// A file cut inside its last page still holds every page its header counts; Open reads no table, so it may
// take it for whole. An empty file is a new catalog.
HostileCase DamageCases::truncated(const HostileSources& sources, size_t size) {
  const size_t lastPageStart = sources.catalog().size() - sources.pageSize();
  std::set<int> answers{2};
  if (size == 0) answers = {1};
  if (size > lastPageStart) answers = {0, 2};
  const auto prepare = [&sources, size](const std::filesystem::path& folder) {
    CaseFiles::writeCatalog(folder, sources.catalog().substr(0, size));
  };
  return HostileCase{"truncated to " + std::to_string(size) + " bytes", prepare, answers};
}

}  // namespace reliability
