#include "KRServices/KRSLocalization.hpp"

#include <gtest/gtest.h>

#include <unistd.h>
#include <filesystem>
#include <fstream>
#include <thread>
#include <vector>

namespace {

const KRString kIncompatibleKey(
    "This catalog isn\u2019t compatible with\n<AppName>. Create a new catalog in\n<AppName> to continue.");

// Writes table files into a fresh temporary folder and removes every loaded table afterwards.
class KRSLocalizationTest : public testing::Test {
 protected:
  void SetUp() override {
    folder_ = std::filesystem::temp_directory_path() /
              ("KRSLocalizationTest-" + std::to_string(::getpid()) + "-" +
               testing::UnitTest::GetInstance()->current_test_info()->name());
    std::filesystem::create_directories(folder_);
  }
  void TearDown() override {
    KRSLocalization::removeAllTables();
    std::filesystem::remove_all(folder_);
  }
  std::string writeFile(const std::string& name, const std::string& contents) const {
    const std::filesystem::path path = folder_ / name;
    std::ofstream(path) << contents;
    return path.string();
  }
  static std::string localized(const char* key) {
    return KRSLocalization::localizedStringForKey(KRString(key), KRString()).str();
  }

 private:
  std::filesystem::path folder_;
};

TEST_F(KRSLocalizationTest, WithoutATableTheKeyIsItsOwnText) {
  const KRString result = KRSLocalization::localizedStringForKey(kIncompatibleKey, KRString());
  EXPECT_TRUE(identical(result, kIncompatibleKey));
}

TEST_F(KRSLocalizationTest, NilKeyGivesNil) {
  EXPECT_TRUE(KRSLocalization::localizedStringForKey(KRString(), KRString("comment")).isNil());
}

TEST_F(KRSLocalizationTest, LoadedTableTranslatesItsKeys) {
  ASSERT_TRUE(KRSLocalization::loadTableFromFile(writeFile(
      "de.json",
      R"({"Hello": "Hallo", "This catalog isn’t compatible with\n<AppName>. Create a new catalog in\n<AppName> to continue.": "Inkompatibel"})")));
  EXPECT_EQ(localized("Hello"), "Hallo");
  EXPECT_EQ(KRSLocalization::localizedStringForKey(kIncompatibleKey, KRString()).str(), "Inkompatibel");
  EXPECT_EQ(localized("Unknown"), "Unknown");
}

TEST_F(KRSLocalizationTest, LaterTablesWinAndTablesMerge) {
  ASSERT_TRUE(KRSLocalization::loadTableFromFile(writeFile("a.json", R"({"one": "eins", "two": "zwei"})")));
  ASSERT_TRUE(
      KRSLocalization::loadTableFromFile(writeFile("b.json", R"({"two": "deux", "three": "trois"})")));
  EXPECT_EQ(localized("one"), "eins");
  EXPECT_EQ(localized("two"), "deux");
  EXPECT_EQ(localized("three"), "trois");
}

TEST_F(KRSLocalizationTest, MissingFileIsRefused) {
  EXPECT_FALSE(KRSLocalization::loadTableFromFile(writeFile("unused", "") + ".missing"));
  EXPECT_FALSE(KRSLocalization::loadTableFromFile(""));
}

TEST_F(KRSLocalizationTest, BadFilesAreRefusedAndChangeNothing) {
  ASSERT_TRUE(KRSLocalization::loadTableFromFile(writeFile("good.json", R"({"key": "good"})")));
  for (const char* contents :
       {"", "{\"key\": ", "not json", "[\"key\", \"text\"]", "\"text\"", R"({"key": "bad", "number": 5})",
        R"({"key": "bad", "nested": {"a": "b"}})", "{\"key\": \"\xff\xfe\"}"}) {
    EXPECT_FALSE(KRSLocalization::loadTableFromFile(writeFile("bad.json", contents))) << contents;
  }
  EXPECT_EQ(localized("key"), "good");
}

TEST_F(KRSLocalizationTest, FolderIsRefused) {
  EXPECT_FALSE(KRSLocalization::loadTableFromFile(std::filesystem::temp_directory_path().string()));
}

TEST_F(KRSLocalizationTest, RemoveAllTablesForgetsTranslations) {
  ASSERT_TRUE(KRSLocalization::loadTableFromFile(writeFile("t.json", R"({"Hello": "Hallo"})")));
  KRSLocalization::removeAllTables();
  EXPECT_EQ(localized("Hello"), "Hello");
}

TEST_F(KRSLocalizationTest, LookupsWhileTablesLoad) {
  const std::string path = writeFile("t.json", R"({"Hello": "Hallo"})");
  std::vector<std::thread> readers;
  for (int reader = 0; reader < 3; ++reader) {
    readers.emplace_back([] {
      for (int i = 0; i < 500; ++i) {
        const KRString text = KRSLocalization::localizedStringForKey(KRString("Hello"), KRString());
        EXPECT_TRUE(text == KRString("Hello") || text == KRString("Hallo"));
      }
    });
  }
  for (int i = 0; i < 50; ++i) EXPECT_TRUE(KRSLocalization::loadTableFromFile(path));
  for (std::thread& reader : readers) reader.join();
  EXPECT_EQ(localized("Hello"), "Hallo");
}

}  // namespace
