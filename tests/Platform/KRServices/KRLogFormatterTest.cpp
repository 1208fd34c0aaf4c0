#include "KRServices/KRLogFormatter.hpp"

#include <gtest/gtest.h>

#include <array>
#include <climits>
#include <cstdint>

namespace {

template <class... Args>
std::string format(const char* text, const Args&... args) {
  const std::array<KRLogArgument, sizeof...(Args)> arguments{KRLogArgument(args)...};
  return KRLogFormatter::format(text, arguments);
}

TEST(KRLogFormatterTest, TextWithoutConversionsIsCopied) {
  EXPECT_EQ(format("plain text"), "plain text");
  EXPECT_EQ(format(""), "");
  EXPECT_EQ(format(nullptr), "(null)");
}

TEST(KRLogFormatterTest, FlagsWidthAndPrecisionReachTheNumber) {
  EXPECT_EQ(format("[%-5d][%05d][%+d][% d]", 42, 42, 42, 42), "[42   ][00042][+42][ 42]");
  EXPECT_EQ(format("[%#x][%X][%o][%8.3e]", 255, 255, 8, 1234.5), "[0xff][FF][10][1.234e+03]");
  EXPECT_EQ(format("[%.3s][%6@][%-4s]", "abcdef", "ab", "c"), "[abc][    ab][c   ]");
}

TEST(KRLogFormatterTest, IntegersAreReadInTheWidthOfTheirType) {
  EXPECT_EQ(format("%u %x", -1, -1), "4294967295 ffffffff");
  EXPECT_EQ(format("%lu", -1L), "18446744073709551615");
  EXPECT_EQ(format("%d %lld", UINT32_MAX, UINT64_MAX), "-1 -1");
  EXPECT_EQ(format("%d %u", static_cast<short>(-2), static_cast<unsigned char>(200)), "-2 200");
  EXPECT_EQ(format("%lld %llu", LLONG_MIN, ULLONG_MAX), "-9223372036854775808 18446744073709551615");
}

TEST(KRLogFormatterTest, ShortModifiersNarrowTheValue) {
  EXPECT_EQ(format("%hhd %hhx %hd %hu", 300, -1, 70000, -1), "44 ff 4464 65535");
}

TEST(KRLogFormatterTest, FloatingConversionsAcceptIntegers) {
  EXPECT_EQ(format("%.1f %g", 3, 7u), "3.0 7");
  EXPECT_EQ(format("%d %@ %s", true, false, true), "1 0 1");
}

TEST(KRLogFormatterTest, CharacterConversionPrintsTheByte) {
  EXPECT_EQ(format("%c%c%c", 'o', 107, 0x121), "ok!");
}

TEST(KRLogFormatterTest, PointerConversion) {
  int target = 0;
  char address[32];
  std::snprintf(address, sizeof address, "%p", static_cast<void*>(&target));
  EXPECT_EQ(format("%p", &target), address);
  EXPECT_EQ(format("%@", static_cast<int*>(nullptr)), format("%p", static_cast<void*>(nullptr)));
}

TEST(KRLogFormatterTest, UnknownOrUnfinishedConversionsAreCopiedAsWritten) {
  EXPECT_EQ(format("%y %d", 1), "%y 1");
  EXPECT_EQ(format("%*d", 5), "%*d");
  EXPECT_EQ(format("ends with %"), "ends with %");
  EXPECT_EQ(format("ends with %5.2l", 1.0), "ends with %5.2l");
  EXPECT_EQ(format("%n", 1), "%n");
}

TEST(KRLogFormatterTest, OverlongWidthIsNotHonoured) {
  EXPECT_EQ(format("%123456789d", 1), "%123456789d");
  EXPECT_EQ(format("%.99999f|%d", 2), "%.99999f|2");
  EXPECT_EQ(format("%9999d", 1).size(), 9999u);
}

TEST(KRLogFormatterTest, PercentNeedsNoArgument) {
  EXPECT_EQ(format("100%% of %d", 3), "100% of 3");
  EXPECT_EQ(format("%%%%"), "%%");
}

}  // namespace
