#include "Model/KRDBEntitiesFilter/KRDBValueBox.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRTestEntities.hpp"
#include "Model/KRDBEntity/KRDBEntityContext.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"

namespace {

using KRTestEntities::makeImage;

TEST(KRDBValueBoxTest, TheValueCarriesTheSameObjectWithoutCopyingIt) {
  const auto entities = std::make_shared<KRDBEntitySet>(KRDBEntitySet{makeImage(1), makeImage(2)});
  const KRValue value = KRDBValueBox<KRDBEntitySet>::valueWith(entities);
  EXPECT_EQ(value.type(), KRValue::Type::Object);
  EXPECT_EQ(KRDBValueBox<KRDBEntitySet>::heldBy(value), entities);
}

TEST(KRDBValueBoxTest, AnEmptyPointerGivesNil) {
  EXPECT_TRUE(KRDBValueBox<KRDBEntitySet>::valueWith(nullptr).isNil());
}

TEST(KRDBValueBoxTest, AValueWithoutSuchABoxHoldsNothing) {
  EXPECT_EQ(KRDBValueBox<KRDBEntitySet>::heldBy(KRValue()), nullptr);
  EXPECT_EQ(KRDBValueBox<KRDBEntitySet>::heldBy(KRValue("text")), nullptr);
  const KRValue otherBox = KRDBValueBox<int>::valueWith(std::make_shared<int>(3));
  EXPECT_EQ(KRDBValueBox<KRDBEntitySet>::heldBy(otherBox), nullptr);
  EXPECT_EQ(*KRDBValueBox<int>::heldBy(otherBox), 3);
}

TEST(KRDBValueBoxTest, DictionariesHoldTheBoxByIdentity) {
  const auto entities = std::make_shared<KRDBEntitySet>();
  const KRDictionary info{{KRValue("key"), KRDBValueBox<KRDBEntitySet>::valueWith(entities)}};
  EXPECT_EQ(KRDBValueBox<KRDBEntitySet>::heldBy(info.objectForKey(KRValue("key"))), entities);
}

}  // namespace
