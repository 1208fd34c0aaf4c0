#include "KRFoundation/KRObject.hpp"

#include <gtest/gtest.h>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRValue.hpp"

namespace {

class Sample : public KRObject {
 public:
  KRValue valueForKey(const std::string& key) const override {
    if (key == "rating") return rating_;
    return KRObject::valueForKey(key);
  }
  void setValueForKey(const KRValue& value, const std::string& key) override {
    if (key == "rating") {
      rating_ = value.number().intValue();
      return;
    }
    KRObject::setValueForKey(value, key);
  }
  int rating_ = 0;
};

class Forgiving : public Sample {
 public:
  void setValueForUndefinedKey(const KRValue&, const std::string& key) override { ignored.push_back(key); }
  std::vector<std::string> ignored;
};

}  // namespace

TEST(KRObjectTest, ClassNameIsDemangled) {
  auto object = std::make_shared<Sample>();
  EXPECT_EQ(object->className(), "(anonymous namespace)::Sample");
}

TEST(KRObjectTest, DefaultDescriptionHasClassAndAddress) {
  auto object = std::make_shared<Sample>();
  const std::string text = object->description();
  EXPECT_EQ(text.rfind("<(anonymous namespace)::Sample: 0x", 0), 0u);
  EXPECT_EQ(text.back(), '>');
}

TEST(KRObjectTest, EqualityDefaultsToIdentity) {
  auto a = std::make_shared<Sample>();
  auto b = std::make_shared<Sample>();
  EXPECT_TRUE(a->isEqual(a));
  EXPECT_FALSE(a->isEqual(b));
  EXPECT_FALSE(a->isEqual(nullptr));
  EXPECT_NE(a->hash(), b->hash());
}

TEST(KRObjectTest, KeyValueCodingReachesDeclaredKeys) {
  auto object = std::make_shared<Sample>();
  object->setValueForKey(4, "rating");
  EXPECT_EQ(object->rating_, 4);
  EXPECT_EQ(object->valueForKey("rating"), KRValue(4));
}

TEST(KRObjectTest, UnknownKeysRaiseByDefault) {
  auto object = std::make_shared<Sample>();
  try {
    object->valueForKey("nothing");
    FAIL() << "no exception";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRString(KRException::NSUnknownKeyException));
    EXPECT_NE(exception.reason().str().find("not key value coding-compliant for the key nothing."),
              std::string::npos);
  }
  EXPECT_THROW(object->setValueForKey(1, "nothing"), KRException);
}

TEST(KRObjectTest, ClassMayChooseToIgnoreUnknownKeysOnSet) {
  auto object = std::make_shared<Forgiving>();
  object->setValueForKey(1, "nothing");
  ASSERT_EQ(object->ignored.size(), 1u);
  EXPECT_EQ(object->ignored[0], "nothing");
}
