#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

// What the benchmarks that fill catalogs through the engine and read them back raw share: making many
// records at once, and the plain struct of an image row. Any thread.
namespace KRBenchRecords {

// `count` new records, record i set up by `setUp(record, i)`.
template <class Record, class SetUp>
std::vector<std::shared_ptr<Record>> records(int count, SetUp&& setUp) {
  std::vector<std::shared_ptr<Record>> made;
  made.reserve(count);
  for (int i = 0; i < count; ++i) setUp(*made.emplace_back(std::make_shared<Record>()), i);
  return made;
}

// Every column of an image row.
struct RawImage {
  int64_t id = 0;
  bool markedToDelete = false;
  std::wstring guid;
  std::wstring path;
  int32_t width = 0;
  int32_t height = 0;
  int64_t fileSize = 0;
  int64_t modificationDate = 0;
  int64_t importDate = 0;
  int32_t importIndex = 0;
  int64_t creationDate = 0;
  int64_t folderPathId = 0;
};

}  // namespace KRBenchRecords
