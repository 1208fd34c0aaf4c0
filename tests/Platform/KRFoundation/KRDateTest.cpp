#include "KRFoundation/KRDate.hpp"

#include <gtest/gtest.h>

TEST(KRDateTest, AnswersItsSecondsSince1970) {
  const auto date = KRDate::dateWithTimeIntervalSince1970(1234.5);
  EXPECT_DOUBLE_EQ(date.timeIntervalSince1970(), 1234.5);
  EXPECT_FALSE(date.isNil());
  EXPECT_TRUE(KRDate().isNil());
}

TEST(KRDateTest, DescriptionIsUtc) {
  EXPECT_EQ(KRDate::dateWithTimeIntervalSince1970(0).description(), "1970-01-01 00:00:00 +0000");
  EXPECT_EQ(KRDate::dateWithTimeIntervalSince1970(978307200.9).description(), "2001-01-01 00:00:00 +0000");
  EXPECT_EQ(KRDate::dateWithTimeIntervalSince1970(-1).description(), "1969-12-31 23:59:59 +0000");
}

TEST(KRDateTest, EqualityIsByTimeAndIdentityByObject) {
  const auto a = KRDate::dateWithTimeIntervalSince1970(10);
  const auto b = KRDate::dateWithTimeIntervalSince1970(10);
  EXPECT_EQ(a, b);
  EXPECT_EQ(a.hash(), b.hash());
  EXPECT_FALSE(identical(a, b));
  EXPECT_FALSE(a == KRDate());
}

TEST(KRDateTest, OrdersByTime) {
  const auto early = KRDate::dateWithTimeIntervalSince1970(-5);
  const auto late = KRDate::dateWithTimeIntervalSince1970(5);
  EXPECT_EQ(early.compare(late), KROrderedAscending);
  EXPECT_EQ(late.compare(early), KROrderedDescending);
  EXPECT_EQ(late.compare(late), KROrderedSame);
}

TEST(KRDateTest, RelativeDates) {
  const auto soon = KRDate::dateWithTimeIntervalSinceNow(100);
  EXPECT_NEAR(soon.timeIntervalSinceNow(), 100, 5);
  EXPECT_GT(KRDate::distantFuture().timeIntervalSinceNow(), 1e9);
}
