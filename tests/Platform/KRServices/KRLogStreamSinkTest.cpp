#include "KRServices/KRLogStreamSink.hpp"

#include <gtest/gtest.h>

#include <cstdlib>
#include <optional>

namespace {

KRLogRecord recordAtLevel(int level) {
  return {.level = level,
          .sourcePath = "Dir/File",
          .function = "run",
          .line = 9,
          .message = "level " + std::to_string(level)};
}

// Everything written to a temporary stream.
class StreamCapture {
 public:
  StreamCapture() : stream_(std::tmpfile()) {}
  ~StreamCapture() { std::fclose(stream_); }
  FILE* stream() const { return stream_; }
  std::string contents() const {
    std::rewind(stream_);
    std::string text;
    for (int c = std::fgetc(stream_); c != EOF; c = std::fgetc(stream_)) text.push_back(static_cast<char>(c));
    return text;
  }

 private:
  FILE* stream_;
};

// Sets KR_LOG_LEVEL for one test and restores it afterwards.
class KRLogStreamSinkEnvironmentTest : public testing::Test {
 protected:
  void SetUp() override {
    if (const char* value = std::getenv(KRLogStreamSink::kThresholdVariable)) saved_ = value;
  }
  void TearDown() override {
    if (saved_) {
      setenv(KRLogStreamSink::kThresholdVariable, saved_->c_str(), 1);
    } else {
      unsetenv(KRLogStreamSink::kThresholdVariable);
    }
  }
  static void setLevel(const char* value) { setenv(KRLogStreamSink::kThresholdVariable, value, 1); }

 private:
  std::optional<std::string> saved_;
};

TEST(KRLogStreamSinkTest, LineShowsLevelPlaceAndMessage) {
  EXPECT_EQ(KRLogStreamSink::lineForRecord(recordAtLevel(4)), "[4] Dir/File:9 run: level 4\n");
}

TEST(KRLogStreamSinkTest, WritesOnlyRecordsAtOrBelowTheThreshold) {
  StreamCapture capture;
  const KRLogStreamSink sink(capture.stream(), KRLogLevelError);
  for (int level = 0; level <= 4; ++level) sink(recordAtLevel(level));
  EXPECT_EQ(capture.contents(),
            "[0] Dir/File:9 run: level 0\n[1] Dir/File:9 run: level 1\n[2] Dir/File:9 run: level 2\n");
}

TEST(KRLogStreamSinkTest, ThresholdFourWritesWarnings) {
  StreamCapture capture;
  const KRLogStreamSink sink(capture.stream(), KRLogLevelWarning);
  sink(recordAtLevel(KRLogLevelWarning));
  sink(recordAtLevel(5));
  EXPECT_EQ(capture.contents(), "[4] Dir/File:9 run: level 4\n");
}

TEST_F(KRLogStreamSinkEnvironmentTest, ThresholdDefaultsToErrors) {
  unsetenv(KRLogStreamSink::kThresholdVariable);
  EXPECT_EQ(KRLogStreamSink::thresholdFromEnvironment(), KRLogLevelError);
  EXPECT_EQ(KRLogStreamSink().threshold(), KRLogLevelError);
}

TEST_F(KRLogStreamSinkEnvironmentTest, EnvironmentOverridesTheThreshold) {
  setLevel("4");
  EXPECT_EQ(KRLogStreamSink::thresholdFromEnvironment(), 4);
  EXPECT_EQ(KRLogStreamSink().threshold(), 4);
  setLevel("0");
  EXPECT_EQ(KRLogStreamSink::thresholdFromEnvironment(), 0);
}

TEST_F(KRLogStreamSinkEnvironmentTest, NonNumericEnvironmentKeepsTheDefault) {
  for (const char* value : {"", "verbose", "3x", " 3", "99999999999"}) {
    setLevel(value);
    EXPECT_EQ(KRLogStreamSink::thresholdFromEnvironment(), KRLogLevelError) << value;
  }
}

}  // namespace
