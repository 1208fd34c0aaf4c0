#include "KRFoundation/KRStringComparator.hpp"

#include <gtest/gtest.h>

namespace {

const KRStringComparator kExact(false, false);
const KRStringComparator kCase(true, false);
const KRStringComparator kDiacritics(false, true);
const KRStringComparator kBoth(true, true);

}  // namespace

TEST(KRStringComparatorTest, FoldingFollowsTheOptions) {
  EXPECT_EQ(kExact.fold("Résumé"), "Résumé");
  EXPECT_EQ(kCase.fold("Résumé"), "résumé");
  EXPECT_EQ(kDiacritics.fold("Résumé"), "Resume");
  EXPECT_EQ(kBoth.fold("Résumé"), "resume");
  EXPECT_EQ(kCase.fold("STRASSE"), kCase.fold("straße"));
  EXPECT_EQ(kDiacritics.fold("e\xCC\x81"), "e");
  EXPECT_EQ(kCase.fold("\xFF"), "\xEF\xBF\xBD");
}

TEST(KRStringComparatorTest, CompareByCodePoint) {
  EXPECT_EQ(kExact.compare("a", "b"), KROrderedAscending);
  EXPECT_EQ(kExact.compare("Z", "a"), KROrderedAscending);
  EXPECT_EQ(kExact.compare("\xF0\x9F\x98\x80", "\xEF\xBF\xBF"), KROrderedDescending);
  EXPECT_EQ(kCase.compare("Z", "a"), KROrderedDescending);
  EXPECT_EQ(kBoth.compare("Ÿ", "y"), KROrderedSame);
}

TEST(KRStringComparatorTest, PrefixesSuffixesAndParts) {
  EXPECT_TRUE(kExact.beginsWith("photo.jpg", "photo"));
  EXPECT_FALSE(kExact.beginsWith("photo.jpg", "Photo"));
  EXPECT_TRUE(kCase.beginsWith("photo.jpg", "PHOTO"));
  EXPECT_TRUE(kExact.beginsWith("x", ""));
  EXPECT_FALSE(kExact.beginsWith("", "x"));
  EXPECT_TRUE(kExact.endsWith("photo.jpg", ".jpg"));
  EXPECT_TRUE(kBoth.endsWith("CAFÉ", "fe"));
  EXPECT_TRUE(kExact.contains("photo.jpg", "o.j"));
  EXPECT_FALSE(kExact.contains("photo.jpg", "O.J"));
  EXPECT_TRUE(kDiacritics.contains("naïve café", "ive ca"));
}

TEST(KRStringComparatorTest, LikeWildcards) {
  EXPECT_TRUE(kExact.like("photo.jpg", "*.jpg"));
  EXPECT_TRUE(kExact.like("photo.jpg", "p?oto.*"));
  EXPECT_FALSE(kExact.like("photo.jpg", "*.png"));
  EXPECT_TRUE(kExact.like("", "*"));
  EXPECT_FALSE(kExact.like("", "?"));
  EXPECT_TRUE(kExact.like("é", "?"));
  EXPECT_TRUE(kExact.like("a*b", "a\\*b"));
  EXPECT_FALSE(kExact.like("axb", "a\\*b"));
  EXPECT_TRUE(kExact.like("a?", "a\\?"));
  EXPECT_TRUE(kExact.like("a\\", "a\\"));
  EXPECT_TRUE(kExact.like("abcabcabd", "*abd"));
  EXPECT_TRUE(kExact.like("mississippi", "m*iss*ppi"));
  EXPECT_FALSE(kExact.like("mississippi", "m*iss*ppx"));
  EXPECT_TRUE(kBoth.like("ÉTÉ.JPG", "ete.*"));
}

TEST(KRStringComparatorTest, LikeStaysFastOnPathologicalPatterns) {
  const std::string text(20000, 'a');
  EXPECT_FALSE(kExact.like(text, "*a*a*a*a*a*a*a*a*b"));
  EXPECT_TRUE(kExact.like(text, "*a*a*a*a*a*a*a*a"));
}
