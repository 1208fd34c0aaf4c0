#include "KRFoundation/KRString.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <string>
#include <thread>
#include <vector>

namespace {

std::wstring wide(std::initializer_list<uint32_t> codePoints) {
  std::wstring result;
  for (uint32_t c : codePoints) result.push_back(static_cast<wchar_t>(c));
  return result;
}

std::vector<std::string> sortedWith(std::vector<std::string> names,
                                    KRComparisonResult (KRString::*order)(const KRString&) const) {
  std::sort(names.begin(), names.end(), [order](const std::string& a, const std::string& b) {
    return (KRString(a).*order)(KRString(b)) == KROrderedAscending;
  });
  return names;
}

TEST(KRStringTest, DefaultHandleIsNilWithEmptyText) {
  const KRString nil;
  EXPECT_TRUE(nil.isNil());
  EXPECT_FALSE(static_cast<bool>(nil));
  EXPECT_EQ(nil.str(), "");
  EXPECT_STREQ(nil.c_str(), "");
  EXPECT_EQ(nil.length(), 0u);
  EXPECT_TRUE(nil.empty());
  EXPECT_FALSE(KRString("").isNil());
  EXPECT_TRUE(KRString(static_cast<const char*>(nullptr)).isNil());
}

TEST(KRStringTest, ConstructorsKeepTheBytes) {
  const std::string bytes("a\0b", 3);
  EXPECT_EQ(KRString(bytes).length(), 3u);
  EXPECT_EQ(KRString(std::string_view(bytes)).str(), bytes);
  EXPECT_EQ(KRString("photo.jpg").str(), "photo.jpg");
}

TEST(KRStringTest, FreshStringsAreEqualButNotIdentical) {
  const KRString a("photo");
  const KRString b(std::string("photo"));
  const KRString copy = a;
  EXPECT_TRUE(a == b);
  EXPECT_FALSE(identical(a, b));
  EXPECT_TRUE(identical(a, copy));
  EXPECT_FALSE(a == KRString("Photo"));
}

TEST(KRStringTest, NilEqualsOnlyNil) {
  EXPECT_TRUE(KRString() == KRString());
  EXPECT_FALSE(KRString() == KRString(""));
  EXPECT_FALSE(KRString("") == KRString());
  EXPECT_TRUE(identical(KRString(), KRString()));
}

TEST(KRStringTest, HashFollowsEquality) {
  EXPECT_EQ(KRString("folder").hash(), KRString(std::string("folder")).hash());
  EXPECT_NE(KRString("folder").hash(), KRString("folders").hash());
  EXPECT_EQ(KRString().hash(), 0u);
}

TEST(KRStringTest, WideConversionOfLatinAndCjk) {
  const KRString text("Caf\u00e9 \u5199\u771f");
  EXPECT_EQ(text.krs_wstring(), wide({'C', 'a', 'f', 0xE9, ' ', 0x5199, 0x771F}));
  EXPECT_EQ(KRString::krs_stringWithWString(text.krs_wstring()), text);
}

TEST(KRStringTest, CharactersOutsideTheBasicPlaneRoundTrip) {
  const KRString text("\U0001F600 \U00010000\U0010FFFF");
  const std::wstring converted = text.krs_wstring();
  EXPECT_EQ(converted, wide({0x1F600, ' ', 0x10000, 0x10FFFF}));
  EXPECT_EQ(KRString::krs_stringWithWString(converted).str(),
            "\xF0\x9F\x98\x80 \xF0\x90\x80\x80\xF4\x8F\xBF\xBF");
}

TEST(KRStringTest, EmbeddedNulAndEmptyRoundTrip) {
  const KRString text(std::string("a\0b", 3));
  EXPECT_EQ(text.krs_wstring(), wide({'a', 0, 'b'}));
  EXPECT_EQ(KRString::krs_stringWithWString(text.krs_wstring()), text);
  EXPECT_EQ(KRString::krs_stringWithWString(L""), KRString(""));
  EXPECT_EQ(KRString().krs_wstring(), L"");
}

struct InvalidUtf8Case {
  const char* name;
  std::string bytes;
  std::wstring expected;
};

TEST(KRStringTest, InvalidUtf8BecomesOneReplacementPerMaximalSubpart) {
  const uint32_t r = 0xFFFD;
  const std::vector<InvalidUtf8Case> cases = {
      {"stray continuation", "a\xBF!", wide({'a', r, '!'})},
      {"lone continuation", "\x80", wide({r})},
      {"overlong two bytes", "\xC0\xAF", wide({r, r})},
      {"overlong three bytes", "\xE0\x80\xAF", wide({r, r, r})},
      {"overlong four bytes", "\xF0\x80\x80\xAF", wide({r, r, r, r})},
      {"encoded surrogate", "\xED\xA0\x80", wide({r, r, r})},
      {"truncated three bytes", "\xE2\x82", wide({r})},
      {"truncated then ascii", "\xE2\x82z", wide({r, 'z'})},
      {"truncated four bytes at end", "x\xF0\x9F\x98", wide({'x', r})},
      {"beyond U+10FFFF", "\xF4\x90\x80\x80", wide({r, r, r, r})},
      {"invalid lead F5", "\xF5\x80", wide({r, r})},
      {"byte FF", "\xFF", wide({r})},
      {"two truncated sequences", "\xE2\x82\xE2\x82", wide({r, r})},
  };
  for (const auto& c : cases) {
    EXPECT_EQ(KRString(c.bytes).krs_wstring(), c.expected) << c.name;
  }
}

TEST(KRStringTest, InvalidWideValuesBecomeReplacementCharacters) {
  const std::string replacement = "\xEF\xBF\xBD";
  const std::vector<std::wstring> invalid = {wide({0xD800}),    wide({0xDBFF}),   wide({0xDC00}),
                                             wide({0xDFFF}),    wide({0x110000}), wide({0xFFFFFFFF}),
                                             wide({0x7FFFFFFF})};
  for (const auto& value : invalid) {
    EXPECT_EQ(KRString::krs_stringWithWString(value).str(), replacement) << static_cast<uint32_t>(value[0]);
  }
  EXPECT_EQ(KRString::krs_stringWithWString(wide({'a', 0xD83D, 0xDE00, 'b'})).str(),
            "a" + replacement + replacement + "b");
}

TEST(KRStringTest, CompareOrdersByCodePoint) {
  EXPECT_EQ(KRString("a").compare("b"), KROrderedAscending);
  EXPECT_EQ(KRString("b").compare("a"), KROrderedDescending);
  EXPECT_EQ(KRString("same").compare(KRString(std::string("same"))), KROrderedSame);
  EXPECT_EQ(KRString("Z").compare("a"), KROrderedAscending);
  EXPECT_EQ(KRString("\u00e9").compare("z"), KROrderedDescending);
  // UTF-16 code unit order would put the emoji (a surrogate pair) before U+FFFF.
  EXPECT_EQ(KRString("\uFFFF").compare("\U0001F600"), KROrderedAscending);
  EXPECT_EQ(KRString("ab").compare("abc"), KROrderedAscending);
}

TEST(KRStringTest, NilComparesAsTheEmptyString) {
  const KRString nil;
  EXPECT_EQ(nil.compare(""), KROrderedSame);
  EXPECT_EQ(nil.compare("a"), KROrderedAscending);
  EXPECT_EQ(KRString("a").compare(nil), KROrderedDescending);
  EXPECT_EQ(nil.caseInsensitiveCompare(""), KROrderedSame);
  EXPECT_EQ(nil.localizedCompare(""), KROrderedSame);
  EXPECT_EQ(nil.localizedStandardCompare("a"), KROrderedAscending);
}

TEST(KRStringTest, CaseInsensitiveCompareFoldsCase) {
  EXPECT_EQ(KRString("HELLO").caseInsensitiveCompare("hello"), KROrderedSame);
  EXPECT_EQ(KRString("stra\u00dfe").caseInsensitiveCompare("STRASSE"), KROrderedSame);
  EXPECT_EQ(KRString("\u00c9MILE").caseInsensitiveCompare("\u00e9mile"), KROrderedSame);
  EXPECT_EQ(KRString("a").caseInsensitiveCompare("B"), KROrderedAscending);
  EXPECT_EQ(KRString("apple").caseInsensitiveCompare("Banana"), KROrderedAscending);
  EXPECT_EQ(KRString("resume").caseInsensitiveCompare("r\u00e9sum\u00e9"), KROrderedAscending);
}

TEST(KRStringTest, CaseInsensitiveCompareUsesCodePointOrder) {
  EXPECT_EQ(KRString("\uFFFF").caseInsensitiveCompare("\U0001F600"), KROrderedAscending);
  EXPECT_EQ(KRString("\U0001F600").caseInsensitiveCompare("\uFFFF"), KROrderedDescending);
}

TEST(KRStringTest, LocalizedCompareSortsAccentedNamesWithTheirBaseLetters) {
  const std::vector<std::string> names = {"Fabian", "\u00c9mile", "Eliza"};
  const std::vector<std::string> collated = {"Eliza", "\u00c9mile", "Fabian"};
  const std::vector<std::string> byCodePoint = {"Eliza", "Fabian", "\u00c9mile"};
  EXPECT_EQ(sortedWith(names, &KRString::localizedCompare), collated);
  EXPECT_EQ(sortedWith(names, &KRString::compare), byCodePoint);
}

TEST(KRStringTest, LocalizedCompareIsCaseAndDiacriticSensitive) {
  EXPECT_EQ(KRString("resume").localizedCompare("r\u00e9sum\u00e9"), KROrderedAscending);
  EXPECT_EQ(KRString("r\u00e9sum\u00e9").localizedCompare("resume"), KROrderedDescending);
  EXPECT_NE(KRString("a").localizedCompare("A"), KROrderedSame);
  EXPECT_EQ(KRString("apple").localizedCompare("Banana"), KROrderedAscending);
  EXPECT_EQ(KRString("\u00e9").localizedCompare(KRString("e\u0301")), KROrderedSame);
}

TEST(KRStringTest, LocalizedStandardCompareOrdersNumbersByValue) {
  EXPECT_EQ(KRString("file2").localizedStandardCompare("file10"), KROrderedAscending);
  EXPECT_EQ(KRString("file2").compare("file10"), KROrderedDescending);
  EXPECT_EQ(KRString("IMG_0099.jpg").localizedStandardCompare("IMG_100.jpg"), KROrderedAscending);
  const std::vector<std::string> names = {"img12.jpg", "IMG1.jpg", "img2.jpg", "Img10.jpg"};
  const std::vector<std::string> expected = {"IMG1.jpg", "img2.jpg", "Img10.jpg", "img12.jpg"};
  EXPECT_EQ(sortedWith(names, &KRString::localizedStandardCompare), expected);
}

TEST(KRStringTest, LocalizedStandardCompareIgnoresCaseButNotDiacritics) {
  EXPECT_EQ(KRString("File10").localizedStandardCompare("file10"), KROrderedSame);
  EXPECT_EQ(KRString("resume").localizedStandardCompare("r\u00e9sum\u00e9"), KROrderedAscending);
  EXPECT_EQ(KRString("\u00c9mile").localizedStandardCompare("Fabian"), KROrderedAscending);
}

TEST(KRStringTest, CollationIsSafeFromSeveralThreads) {
  std::atomic<int> mistakes = 0;
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&mistakes] {
      for (int i = 0; i < 500; ++i) {
        if (KRString("\u00c9mile").localizedCompare("Fabian") != KROrderedAscending) ++mistakes;
        if (KRString("file" + std::to_string(i)).localizedStandardCompare("file" + std::to_string(i + 1)) !=
            KROrderedAscending) {
          ++mistakes;
        }
      }
    });
  }
  for (auto& thread : threads) thread.join();
  EXPECT_EQ(mistakes.load(), 0);
}

struct PathCase {
  const char* input;
  const char* expected;
};

TEST(KRStringTest, LastPathComponent) {
  const std::vector<PathCase> cases = {{"/a/b.jpg", "b.jpg"}, {"/a/b/", "b"}, {"/", "/"},    {"", ""},
                                       {"b.jpg", "b.jpg"},    {"///", "/"},   {"a//b", "b"}, {"/a", "a"}};
  for (const auto& c : cases) EXPECT_EQ(KRString(c.input).lastPathComponent().str(), c.expected) << c.input;
}

struct JoinCase {
  const char* path;
  const char* component;
  const char* expected;
};

TEST(KRStringTest, StringByAppendingPathComponentJoinsWithOneSlash) {
  const std::vector<JoinCase> cases = {
      {"/a", "b", "/a/b"},   {"/a/", "b", "/a/b"}, {"", "b", "b"},       {"/", "b", "/b"},
      {"/a", "/b", "/a/b"},  {"/a", "", "/a"},     {"/a", "b/", "/a/b"}, {"a", "b/c.jpg", "a/b/c.jpg"},
      {"/a//", "b", "/a/b"}, {"", "", ""},
  };
  for (const auto& c : cases) {
    EXPECT_EQ(KRString(c.path).stringByAppendingPathComponent(c.component).str(), c.expected)
        << c.path << " + " << c.component;
  }
}

TEST(KRStringTest, PathExtension) {
  const std::vector<PathCase> cases = {
      {"b.JPG", "JPG"},     {"b", ""},          {".hidden", ""}, {"/a.d/b", ""}, {"/a/b.tar.gz", "gz"},
      {"/a/b.jpg/", "jpg"}, {"/a/.hidden", ""}, {"", ""}};
  for (const auto& c : cases) EXPECT_EQ(KRString(c.input).pathExtension().str(), c.expected) << c.input;
}

TEST(KRStringTest, StringByDeletingPathExtension) {
  const std::vector<PathCase> cases = {{"/a/b.jpg", "/a/b"},
                                       {"/a.d/b", "/a.d/b"},
                                       {".hidden", ".hidden"},
                                       {"b.tar.gz", "b.tar"},
                                       {"/a/b.jpg/", "/a/b"},
                                       {"/", "/"},
                                       {"", ""}};
  for (const auto& c : cases)
    EXPECT_EQ(KRString(c.input).stringByDeletingPathExtension().str(), c.expected) << c.input;
}

TEST(KRStringTest, PathOperationsOnNilGiveNil) {
  const KRString nil;
  EXPECT_TRUE(nil.lastPathComponent().isNil());
  EXPECT_TRUE(nil.stringByAppendingPathComponent("b").isNil());
  EXPECT_TRUE(nil.pathExtension().isNil());
  EXPECT_TRUE(nil.stringByDeletingPathExtension().isNil());
  EXPECT_TRUE(nil.stringByReplacingOccurrencesOfString("a", "b").isNil());
  EXPECT_FALSE(KRString("").lastPathComponent().isNil());
}

TEST(KRStringTest, HasPrefixAndSuffixAreByteWise) {
  const KRString path("/Volumes/Photos/IMG_1.JPG");
  EXPECT_TRUE(path.hasPrefix("/Volumes/"));
  EXPECT_FALSE(path.hasPrefix("/volumes/"));
  EXPECT_TRUE(path.hasSuffix(".JPG"));
  EXPECT_FALSE(path.hasSuffix(".jpg"));
  EXPECT_TRUE(path.hasPrefix(path));
  EXPECT_FALSE(KRString("ab").hasPrefix("abc"));
  EXPECT_FALSE(KRString("\u00e9").hasPrefix("e"));
}

TEST(KRStringTest, EmptyAndNilAreNeverPrefixesOrSuffixes) {
  EXPECT_FALSE(KRString("abc").hasPrefix(""));
  EXPECT_FALSE(KRString("abc").hasSuffix(""));
  EXPECT_FALSE(KRString("abc").hasPrefix(KRString()));
  EXPECT_FALSE(KRString("").hasPrefix(""));
  EXPECT_FALSE(KRString().hasPrefix("a"));
  EXPECT_FALSE(KRString().hasSuffix("a"));
}

TEST(KRStringTest, ReplacingReplacesEveryOccurrenceLeftToRight) {
  EXPECT_EQ(KRString("a-b-c").stringByReplacingOccurrencesOfString("-", "/").str(), "a/b/c");
  EXPECT_EQ(KRString("aaaa").stringByReplacingOccurrencesOfString("aa", "b").str(), "bb");
  EXPECT_EQ(KRString("aaa").stringByReplacingOccurrencesOfString("aa", "b").str(), "ba");
  EXPECT_EQ(KRString("abc").stringByReplacingOccurrencesOfString("b", "bbb").str(), "abbbc");
  EXPECT_EQ(KRString("x.jpg.jpg").stringByReplacingOccurrencesOfString(".jpg", "").str(), "x");
  EXPECT_EQ(KRString("abc").stringByReplacingOccurrencesOfString("b", KRString()).str(), "ac");
}

TEST(KRStringTest, ReplacingWithoutMatchOrWithEmptyTargetKeepsTheReceiver) {
  const KRString text("abc");
  EXPECT_TRUE(identical(text.stringByReplacingOccurrencesOfString("", "x"), text));
  EXPECT_TRUE(identical(text.stringByReplacingOccurrencesOfString(KRString(), "x"), text));
  EXPECT_EQ(text.stringByReplacingOccurrencesOfString("z", "x"), text);
}

}  // namespace
