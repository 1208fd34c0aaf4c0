#include "dbbackuptemporaries.hpp"

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

#include "support/KRTemporaryDirectory.hpp"

using namespace dbcore;

namespace {

pid_t goneProcess() {
  const pid_t pid = fork();
  if (pid == 0) _exit(0);
  waitpid(pid, nullptr, 0);
  return pid;
}

void touch(const std::string& path) { std::ofstream(path) << "x"; }

}  // namespace

TEST(DBBackupTemporariesTest, NamesAreBesideTheDestinationAndNeverRepeat) {
  const DBBackupTemporaries temporaries("/folder/copy.krcatalog");
  const std::string first = temporaries.next();
  EXPECT_EQ(first.rfind("/folder/copy.krcatalog.backup-" + std::to_string(getpid()) + "-", 0), 0u);
  EXPECT_NE(temporaries.next(), first);
}

TEST(DBBackupTemporariesTest, ProcessesThatExistAndThatAreGone) {
  EXPECT_TRUE(DBBackupTemporaries::processExists(getpid()));
  EXPECT_TRUE(DBBackupTemporaries::processExists(1));
  EXPECT_FALSE(DBBackupTemporaries::processExists(goneProcess()));
}

TEST(DBBackupTemporariesTest, RemovesOnlyWellFormedNamesOfGoneProcesses) {
  KRTemporaryDirectory directory;
  const std::string destination = directory.file("copy.krcatalog");
  const std::string gone = std::to_string(goneProcess());
  const std::vector<std::string> removed{".backup-" + gone + "-0", ".backup-" + gone + "-12-journal",
                                         ".backup-" + gone + "-12-wal", ".backup-" + gone + "-12-shm"};
  const std::vector<std::string> kept{
      ".backup-" + gone, ".backup-" + gone + "-", ".backup-" + gone + "-1x",
      ".backup--1",      ".backup-0-1",           ".backup-" + std::to_string(getpid()) + "-1"};
  for (const auto& suffix : removed) touch(destination + suffix);
  for (const auto& suffix : kept) touch(destination + suffix);
  touch(destination);
  DBBackupTemporaries(destination).removeStale();
  for (const auto& suffix : removed) EXPECT_FALSE(std::filesystem::exists(destination + suffix)) << suffix;
  for (const auto& suffix : kept) EXPECT_TRUE(std::filesystem::exists(destination + suffix)) << suffix;
  EXPECT_TRUE(std::filesystem::exists(destination));
}

TEST(DBBackupTemporariesTest, RemoveTakesTheSidecarsWithIt) {
  KRTemporaryDirectory directory;
  const std::string temporary = directory.file("copy.krcatalog.backup-1-0");
  for (const std::string suffix : {"", "-journal", "-wal", "-shm"}) touch(temporary + suffix);
  DBBackupTemporaries::remove(temporary);
  EXPECT_TRUE(std::filesystem::is_empty(directory.path()));
}
