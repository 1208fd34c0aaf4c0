#include "KRServices/KRLogArgument.hpp"

#include <gtest/gtest.h>

#include <stdexcept>

#include "KRFoundation/KRError.hpp"

namespace {

enum class Color : short { Red = 3 };

TEST(KRLogArgumentTest, IntegersKeepTheirSignednessAndWidth) {
  const KRLogArgument minusOne(-1);
  EXPECT_EQ(minusOne.kind(), KRLogArgument::Kind::Signed);
  EXPECT_EQ(minusOne.signedValue(), -1);
  EXPECT_EQ(minusOne.unsignedValue(), 0xffffffffULL);
  const KRLogArgument byte(static_cast<unsigned char>(0xff));
  EXPECT_EQ(byte.kind(), KRLogArgument::Kind::Unsigned);
  EXPECT_EQ(byte.signedValue(), -1);
  EXPECT_EQ(byte.description(), "255");
  EXPECT_EQ(KRLogArgument(Color::Red).description(), "3");
}

TEST(KRLogArgumentTest, FloatingPointNumbersPrintTheirShortestForm) {
  const KRLogArgument number(0.1f);
  EXPECT_EQ(number.kind(), KRLogArgument::Kind::Floating);
  EXPECT_EQ(KRLogArgument(0.1).description(), "0.1");
  EXPECT_EQ(KRLogArgument(1e20).description(), "1e+20");
  EXPECT_FALSE(number.isInteger());
  EXPECT_TRUE(number.isNumber());
}

TEST(KRLogArgumentTest, TextsOfEveryKind) {
  EXPECT_EQ(KRLogArgument("literal").description(), "literal");
  EXPECT_EQ(KRLogArgument(std::string_view("view")).description(), "view");
  EXPECT_EQ(KRLogArgument(std::string("string")).description(), "string");
  EXPECT_EQ(KRLogArgument(std::wstring(L"wide \u00e9")).description(), "wide \u00e9");
  EXPECT_EQ(KRLogArgument(KRString("handle")).kind(), KRLogArgument::Kind::Text);
  EXPECT_EQ(KRLogArgument(std::runtime_error("failed")).description(), "failed");
}

TEST(KRLogArgumentTest, NumberValuesStayNumbers) {
  const KRLogArgument number(KRNumber::numberWithUnsignedLongLong(7));
  EXPECT_EQ(number.kind(), KRLogArgument::Kind::Unsigned);
  EXPECT_EQ(number.unsignedValue(), 7u);
  EXPECT_EQ(KRLogArgument(KRValue(2.5)).doubleValue(), 2.5);
  EXPECT_EQ(KRLogArgument(KRValue(true)).description(), "1");
}

TEST(KRLogArgumentTest, ObjectsKeepTheirAddressAndDescription) {
  const std::shared_ptr<KRError> error = KRError::errorWithDomain(KRString("Domain"), 1);
  const KRLogArgument argument(error);
  EXPECT_EQ(argument.kind(), KRLogArgument::Kind::Pointer);
  EXPECT_EQ(argument.pointer(), static_cast<const void*>(error.get()));
  EXPECT_EQ(argument.description(), error->description());
  EXPECT_EQ(KRLogArgument(KRValue(error)).description(), error->description());
}

TEST(KRLogArgumentTest, NilOfEveryKind) {
  EXPECT_EQ(KRLogArgument(nullptr).kind(), KRLogArgument::Kind::Nil);
  EXPECT_EQ(KRLogArgument(static_cast<const char*>(nullptr)).kind(), KRLogArgument::Kind::Nil);
  EXPECT_EQ(KRLogArgument(KRString()).kind(), KRLogArgument::Kind::Nil);
  EXPECT_EQ(KRLogArgument(KRValue()).kind(), KRLogArgument::Kind::Nil);
  EXPECT_EQ(KRLogArgument(std::shared_ptr<KRError>()).description(), "(null)");
}

}  // namespace
