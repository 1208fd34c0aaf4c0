#pragma once

#include <cstdint>
#include <filesystem>
#include <map>
#include <memory>
#include <vector>

#include "AcknowledgementLog.hpp"
#include "CrashOperationPlanner.hpp"
#include "dbreactor.hpp"

namespace reliability {

// The process a crash trial kills: makes facade calls on a new catalog in a folder, one after another,
// logging each before it starts and once it returned, until it is killed.
class CrashTrialWriter {
 public:
  static constexpr const char* kCatalogName = "catalog.krcatalog";

  CrashTrialWriter(const std::filesystem::path& directory, uint64_t seed);

  // Returns only when a call fails, with the failure reported on the pipe.
  int run(int reportFd);

 private:
  void perform(const CrashOperation& operation);
  void open(int expectedAnswer);
  void writeImages(const CrashOperation& operation);
  void writeUserAttributes(const CrashOperation& operation);
  void writeExifAttributes(const CrashOperation& operation);
  void updateImage(const CrashOperation& operation);
  void removeImages(const CrashOperation& operation);
  void backup(const CrashOperation& operation);

  std::filesystem::path directory_;
  CrashOperationPlanner planner_;
  AcknowledgementLog log_;
  dbcore::DBReactor reactor_;
  std::map<long long, std::vector<std::shared_ptr<dbcore::DBImage>>> images_;
};

}  // namespace reliability
