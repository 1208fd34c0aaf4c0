#include "KRFoundation/KRValue.hpp"

#include <gtest/gtest.h>

#include "KRFoundation/KRException.hpp"

namespace {

class Person : public KRObject {
 public:
  explicit Person(std::string name) : name_(std::move(name)) {}
  KRValue valueForKey(const std::string& key) const override {
    if (key == "name") return name_;
    if (key == "friend") return friend_;
    return KRObject::valueForKey(key);
  }
  std::shared_ptr<Person> friend_;

 private:
  std::string name_;
};

}  // namespace

TEST(KRValueTest, NilHandlesBecomeNil) {
  EXPECT_TRUE(KRValue(KRString()).isNil());
  EXPECT_TRUE(KRValue(KRArray()).isNil());
  EXPECT_TRUE(KRValue(std::shared_ptr<KRObject>()).isNil());
  EXPECT_TRUE(KRValue(nullptr).isNil());
  EXPECT_EQ(KRValue(), KRValue(KRDictionary()));
}

TEST(KRValueTest, TypedViewsAnswerNilForOtherTypes) {
  const KRValue text("abc");
  EXPECT_EQ(text.type(), KRValue::Type::String);
  EXPECT_EQ(text.string(), KRString("abc"));
  EXPECT_TRUE(text.number().isNil());
  EXPECT_TRUE(text.array().isNil());
  EXPECT_EQ(KRValue(5).type(), KRValue::Type::Number);
  EXPECT_EQ(KRValue(true).number().kind(), KRNumber::Kind::Bool);
  EXPECT_EQ(KRValue(7u).number().kind(), KRNumber::Kind::UInt);
}

TEST(KRValueTest, NullIsDistinctFromNil) {
  EXPECT_TRUE(KRValue::null().isNull());
  EXPECT_FALSE(KRValue::null() == KRValue());
  EXPECT_EQ(KRValue::null(), KRValue(KRNull{}));
  EXPECT_EQ(KRValue::null().description(), "<null>");
}

TEST(KRValueTest, EqualityAgainstIdentity) {
  const KRValue a(KRString("photo"));
  const KRValue b(KRString("photo"));
  EXPECT_EQ(a, b);
  EXPECT_FALSE(identical(a, b));
  const KRValue c = a;
  EXPECT_TRUE(identical(a, c));
  EXPECT_TRUE(identical(KRValue(), KRValue()));
  EXPECT_FALSE(KRValue(1) == KRValue("1"));
}

TEST(KRValueTest, ObjectsCompareByTheirEquality) {
  auto a = std::make_shared<Person>("a");
  auto b = std::make_shared<Person>("a");
  EXPECT_EQ(KRValue(a), KRValue(a));
  EXPECT_FALSE(KRValue(a) == KRValue(b));
  EXPECT_EQ(KRValue(a).objectAs<Person>(), a);
}

TEST(KRValueTest, Descriptions) {
  EXPECT_EQ(KRValue().description(), "(null)");
  EXPECT_EQ(KRValue(12).description(), "12");
  EXPECT_EQ(KRValue((KRArray{1, "a"})).description(), "(1, a)");
  EXPECT_EQ(KRValue((KRDictionary{{"k", 1}, {"j", 2}})).description(), "{k = 1; j = 2;}");
  EXPECT_EQ(KRValue((KRSet{1})).description(), "{(1)}");
}

TEST(KRValueTest, DictionaryAnswersKeysOfItsEntries) {
  const KRValue value(KRDictionary{{"a", KRDictionary{{"b", 42}}}});
  EXPECT_EQ(value.valueForKeyPath("a.b"), KRValue(42));
  EXPECT_TRUE(value.valueForKeyPath("a.missing").isNil());
  EXPECT_TRUE(value.valueForKeyPath("missing.b").isNil());
}

TEST(KRValueTest, DateAnswersTimeIntervalSince1970) {
  const KRValue value(KRDate::dateWithTimeIntervalSince1970(99));
  EXPECT_EQ(value.valueForKey("timeIntervalSince1970"), KRValue(99.0));
  EXPECT_THROW(value.valueForKey("year"), KRException);
}

TEST(KRValueTest, ArrayAnswersArrayOfItsElementsValues) {
  const KRValue value(KRArray{KRDictionary{{"n", 1}}, KRDictionary{{"n", 2}}, KRDictionary{}});
  EXPECT_EQ(value.valueForKey("n"), KRValue((KRArray{1, 2, KRValue::null()})));
  EXPECT_EQ(value.valueForKey("@count"), KRValue(3));
}

TEST(KRValueTest, SetAnswersSetOfItsMembersValues) {
  const KRValue value(KRSet{KRDictionary{{"n", 1}}, KRDictionary{{"n", 2}}, KRDictionary{{"m", 3}}});
  EXPECT_EQ(value.valueForKey("n"), KRValue((KRSet{1, 2})));
}

TEST(KRValueTest, KeyPathsThroughObjects) {
  auto alice = std::make_shared<Person>("alice");
  alice->friend_ = std::make_shared<Person>("bob");
  EXPECT_EQ(KRValue(alice).valueForKeyPath("friend.name"), KRValue("bob"));
  EXPECT_EQ(alice->valueForKeyPath("friend.name"), KRValue("bob"));
  EXPECT_TRUE(alice->valueForKeyPath("friend.friend.name").isNil());
}

TEST(KRValueTest, NumbersAndStringsHaveNoKeys) {
  try {
    KRValue(3).valueForKey("x");
    FAIL() << "no exception";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRString(KRException::NSUnknownKeyException));
  }
  EXPECT_THROW(KRValue("s").valueForKey("x"), KRException);
}

TEST(KRValueTest, HashFollowsEquality) {
  EXPECT_EQ(KRValue(1).hash(), KRValue(1.0).hash());
  EXPECT_EQ(KRValue("x").hash(), KRValue(std::string("x")).hash());
  EXPECT_EQ(KRValue(KRArray{1}).hash(), KRValue(KRArray{true}).hash());
}
