#include "KRServices/KRLog.hpp"

#include <gtest/gtest.h>

#include <thread>
#include <vector>

#include "KRFoundation/KRError.hpp"
#include "KRServices/KRCapturingLogSink.hpp"

namespace {

using Lines = std::vector<std::string>;

static_assert(KRLogSourcePath("/repo/DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBCatalog/KRDBCatalog.mm",
                              "/repo/") ==
              "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBCatalog/KRDBCatalog");
static_assert(KRLogSourcePath("/repo/Platform/KRServices/KRLog.cpp", "/repo/") ==
              "Platform/KRServices/KRLog");

TEST(KRLogTest, MacroRecordsSourcePathFunctionAndLine) {
  KRCapturingLogSink sink;
  const int line = __LINE__ + 1;
  KRLog(KRLogLevelWarning, "here");
  const std::vector<KRLogRecord> records = sink.records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].level, KRLogLevelWarning);
  EXPECT_EQ(records[0].sourcePath, "tests/Platform/KRServices/KRLogTest");
  EXPECT_EQ(records[0].function, "TestBody");
  EXPECT_EQ(records[0].line, line);
  EXPECT_EQ(records[0].message, "here");
}

TEST(KRLogTest, SourcePathOutsideTheRootKeepsItsDirectoriesAndLosesItsExtension) {
  EXPECT_EQ(KRLogSourcePath("/elsewhere/file.cpp", "/repo/"), "/elsewhere/file");
  EXPECT_EQ(KRLogSourcePath("/repo/dir.d/name", "/repo/"), "dir.d/name");
  EXPECT_EQ(KRLogSourcePath("/repo/dir/.hidden", "/repo/"), "dir/.hidden");
  EXPECT_EQ(KRLogSourcePath("name.tar.gz", ""), "name.tar");
  EXPECT_EQ(KRLogSourcePath("../../Platform/KRServices/KRLog.cpp", ""), "Platform/KRServices/KRLog");
  EXPECT_EQ(KRLogSourcePath("Platform/KRServices/KRLog.cpp", ""), "Platform/KRServices/KRLog");
}

TEST(KRLogTest, DirectCallPassesEveryFieldThrough) {
  KRCapturingLogSink sink;
  __KRLog(0, 3, "DBCore/Some/Path", "function", 77, "value %d", 5);
  const std::vector<KRLogRecord> expected{{.level = 3,
                                           .sourcePath = "DBCore/Some/Path",
                                           .function = "function",
                                           .line = 77,
                                           .message = "value 5"}};
  EXPECT_EQ(sink.records(), expected);
}

TEST(KRLogTest, ExceptionPrintsItsDescription) {
  KRCapturingLogSink sink;
  const KRException exception(KRString("DBCore(code #5)"), KRString("tag:X: Y"));
  KRLog(KRLogLevelError, "KRDBCatalog handled exception: %@", exception);
  EXPECT_EQ(sink.messages(), (Lines{"KRDBCatalog handled exception: DBCore(code #5): tag:X: Y"}));
}

TEST(KRLogTest, UndefinedKeyWarningPrintsBothStrings) {
  KRCapturingLogSink sink;
  KRLog(KRLogLevelWarning, "Warning!!!\nUndefined Key: %@\nFor obj Class: %@", KRString("rating"),
        std::string("KRDBImage"));
  EXPECT_EQ(sink.messages(), (Lines{"Warning!!!\nUndefined Key: rating\nFor obj Class: KRDBImage"}));
}

TEST(KRLogTest, NumericConversions) {
  KRCapturingLogSink sink;
  KRLog(2, "%ld_%lld", 12L, -5LL);
  KRLog(2, "%lu", size_t{42});
  KRLog(2, "%5.2f", 3.14159);
  KRLog(2, "%%");
  KRLog(2, "%d %i", -7, 8);
  KRLog(2, "%li %lli", -9L, 10LL);
  KRLog(2, "%u %llu", 11u, 12ULL);
  KRLog(2, "%x %lx", 255, 0xabcdefUL);
  KRLog(2, "%f %g", 0.5, 0.25);
  KRLog(2, "%s|%c", "text", 'z');
  EXPECT_EQ(sink.messages(), (Lines{"12_-5", "42", " 3.14", "%", "-7 8", "-9 10", "11 12", "ff abcdef",
                                    "0.500000 0.25", "text|z"}));
}

TEST(KRLogTest, PointerConversionPrintsTheAddress) {
  KRCapturingLogSink sink;
  int target = 0;
  char expected[32];
  std::snprintf(expected, sizeof expected, "%p", static_cast<void*>(&target));
  KRLog(2, "%p", &target);
  EXPECT_EQ(sink.messages(), (Lines{expected}));
}

TEST(KRLogTest, ValueHandlesPrintTheirDescription) {
  KRCapturingLogSink sink;
  const KRDate date = KRDate::dateWithTimeIntervalSince1970(0);
  const KRArray array{KRValue(1), KRValue("a")};
  const KRSet set{KRValue(2)};
  const KRDictionary dictionary{{KRValue("key"), KRValue("value")}};
  KRLog(2, "%@ %@ %@", KRNumber::numberWithLongLong(42), KRNumber::numberWithDouble(0.5), KRValue(true));
  KRLog(2, "%@|%@|%@|%@", date, array, set, dictionary);
  EXPECT_EQ(sink.messages(),
            (Lines{"42 0.5 1", date.description() + "|" + KRValue(array).description() + "|" +
                                   KRValue(set).description() + "|" + KRValue(dictionary).description()}));
}

TEST(KRLogTest, ObjectsPrintTheirDescription) {
  KRCapturingLogSink sink;
  const std::shared_ptr<KRError> error = KRError::errorWithDomain(KRString("Domain"), 7);
  KRLog(2, "%@ / %@", error, KRValue(error));
  EXPECT_EQ(sink.messages(), (Lines{error->description() + " / " + error->description()}));
}

TEST(KRLogTest, NilArgumentsPrintNull) {
  KRCapturingLogSink sink;
  const char* noText = nullptr;
  KRLog(2, "%@ %@ %@ %@ %s", KRString(), KRValue(), std::shared_ptr<KRError>(), nullptr, noText);
  EXPECT_EQ(sink.messages(), (Lines{"(null) (null) (null) (null) (null)"}));
}

TEST(KRLogTest, MissingArgumentsLeaveTheirConversionsAsWritten) {
  KRCapturingLogSink sink;
  KRLog(2, "%@ and %5.2f and %d", KRString("one"));
  KRLog(2, "no arguments %@");
  EXPECT_EQ(sink.messages(), (Lines{"one and %5.2f and %d", "no arguments %@"}));
}

TEST(KRLogTest, MismatchedArgumentsPrintTheirDescription) {
  KRCapturingLogSink sink;
  KRLog(2, "%d|%s|%@|%f|%p|%c", "text", 5, 6, KRString("x"), 2.5, 1.5);
  EXPECT_EQ(sink.messages(), (Lines{"text|5|6|x|2.5|1.5"}));
}

TEST(KRLogTest, ExtraArgumentsAreIgnored) {
  KRCapturingLogSink sink;
  KRLog(2, "only %d", 1, 2, "three");
  EXPECT_EQ(sink.messages(), (Lines{"only 1"}));
}

TEST(KRLogTest, LinesFromFourThreadsAreAllCapturedInTheirOrder) {
  constexpr int kThreads = 4;
  constexpr int kLinesPerThread = 200;
  KRCapturingLogSink sink;
  std::vector<std::thread> threads;
  for (int thread = 0; thread < kThreads; ++thread) {
    threads.emplace_back([thread] {
      for (int line = 0; line < kLinesPerThread; ++line) KRLog(2, "%d %d", thread, line);
    });
  }
  for (std::thread& thread : threads) thread.join();

  std::vector<int> nextLine(kThreads, 0);
  const std::vector<std::string> messages = sink.messages();
  ASSERT_EQ(messages.size(), size_t{kThreads * kLinesPerThread});
  for (const std::string& message : messages) {
    int thread = -1;
    int line = -1;
    ASSERT_EQ(std::sscanf(message.c_str(), "%d %d", &thread, &line), 2);
    ASSERT_TRUE(thread >= 0 && thread < kThreads);
    EXPECT_EQ(line, nextLine[thread]++);
  }
}

}  // namespace
