#include "Model/KRDBEntity/KRDBKeyAccessors.hpp"

#include <gtest/gtest.h>

#include <memory>

namespace {

// A class with one read-write and one read-only property, as entity classes have.
class Sample : public KRObject {
 public:
  int32_t rating() const { return rating_; }
  void setRating(int32_t rating) { rating_ = rating; }
  const KRString& name() const { return name_; }

 private:
  int32_t rating_ = 3;
  KRString name_ = "sample";
};

TEST(KRDBKeyAccessorsTest, AKeyReadsAndWritesThroughItsGetterAndSetter) {
  const KRDBKeyAccessors<Sample> keys{{"rating", krdbKey(&Sample::rating, &Sample::setRating)},
                                      {"name", krdbReadOnlyKey(&Sample::name)}};
  Sample sample;
  EXPECT_EQ(keys.at("rating").get(sample), KRValue(3));
  keys.at("rating").set(sample, KRValue(5));
  EXPECT_EQ(sample.rating(), 5);
  EXPECT_EQ(keys.at("name").get(sample), KRValue("sample"));
  EXPECT_FALSE(keys.at("name").set);
}

TEST(KRDBKeyAccessorsTest, ArgumentsAreConvertedToTheSettersType) {
  EXPECT_EQ(krdbValueAs<bool>(KRValue(1)), true);
  EXPECT_EQ(krdbValueAs<float>(KRValue(0.5)), 0.5f);
  EXPECT_EQ(krdbValueAs<uint64_t>(KRValue(7)), 7u);
  EXPECT_EQ(krdbValueAs<int32_t>(KRValue(-7)), -7);
  EXPECT_EQ(krdbValueAs<KRString>(KRValue("text")), KRString("text"));
  EXPECT_EQ(krdbValueAs<KRDate>(KRValue(KRDate::dateWithTimeIntervalSince1970(2))).timeIntervalSince1970(),
            2.0);
  const auto sample = std::make_shared<Sample>();
  EXPECT_EQ(krdbValueAs<std::shared_ptr<Sample>>(KRValue(sample)), sample);
  EXPECT_EQ(krdbValueAs<int32_t>(KRValue("not a number")), 0);
}

}  // namespace
