#include "dbopenclassifier.hpp"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include "DBFileSetTestSupport.hpp"
#include "dbreactor.hpp"
#include "dbschema.hpp"
#include "support/KRTemporaryDirectory.hpp"

using namespace dbcore;

namespace {

int classify(const std::string& path) {
  return DBOpenClassifier(path, DBSchema::applicationIdFor(5)).classify();
}

}  // namespace

TEST(DBOpenClassifierTest, MissingAndEmptyFilesAreNew) {
  KRTemporaryDirectory directory;
  EXPECT_EQ(classify(directory.file("missing.db")), kDBOpenNeedsUpdate);
  writeFileBytes(directory.file("empty.db"), "");
  EXPECT_EQ(classify(directory.file("empty.db")), kDBOpenNeedsUpdate);
  EXPECT_EQ(classify(""), kDBOpenFailed);
}

TEST(DBOpenClassifierTest, WhatIsNotARegularFileFailsWithoutBeingRead) {
  KRTemporaryDirectory directory;
  const std::string fifo = directory.file("pipe");
  ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
  EXPECT_EQ(classify(fifo), kDBOpenFailed);
  EXPECT_EQ(classify(directory.path().string()), kDBOpenFailed);
  EXPECT_EQ(classify("/dev/null"), kDBOpenFailed);
}

TEST(DBOpenClassifierTest, ANonEmptyJournalBesideAnEmptyFileFails) {
  KRTemporaryDirectory directory;
  writeFileBytes(directory.file("empty.db-journal"), "journal");
  EXPECT_EQ(classify(directory.file("empty.db")), kDBOpenFailed);
  writeFileBytes(directory.file("empty.db-journal"), "");
  EXPECT_EQ(classify(directory.file("empty.db")), kDBOpenNeedsUpdate);
}

TEST(DBOpenClassifierTest, TextFails) {
  KRTemporaryDirectory directory;
  writeFileBytes(directory.file("text.db"), std::string(300, 't'));
  EXPECT_EQ(classify(directory.file("text.db")), kDBOpenFailed);
}
