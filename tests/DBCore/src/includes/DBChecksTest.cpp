#include "dbchecks.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "dbexception.hpp"
#include "dbimage.hpp"
#include "dbpath.hpp"

using namespace dbcore;

namespace {

template <class T>
std::shared_ptr<T> savedRecord(int64_t id) {
  auto record = std::make_shared<T>();
  record->set_id(id);
  return record;
}

using ImagePathCheck = PairCheckDefault<DBPath, DBImage>;

}  // namespace

TEST(DBChecksTest, ValueCheckAcceptsAnyRecordSavedOrNot) {
  EXPECT_NO_THROW(ValueCheckDefault<DBImage>::check(std::make_shared<DBImage>()));
  EXPECT_NO_THROW(ValueCheckDefault<DBImage>::check(savedRecord<DBImage>(3)));
}

TEST(DBChecksTest, ValueCheckRejectsAnEmptyRecord) {
  EXPECT_THROW(ValueCheckDefault<DBImage>::check(nullptr), DBException);
}

TEST(DBChecksTest, PairCheckAcceptsTwoSavedRecords) {
  EXPECT_NO_THROW(ImagePathCheck::check(savedRecord<DBPath>(1), savedRecord<DBImage>(2)));
}

TEST(DBChecksTest, PairCheckRejectsAnEmptyRecordOnEitherSide) {
  EXPECT_THROW(ImagePathCheck::check(nullptr, savedRecord<DBImage>(2)), DBException);
  EXPECT_THROW(ImagePathCheck::check(savedRecord<DBPath>(1), nullptr), DBException);
}

TEST(DBChecksTest, PairCheckRejectsAnUnsavedRecordOnEitherSide) {
  EXPECT_THROW(ImagePathCheck::check(std::make_shared<DBPath>(), savedRecord<DBImage>(2)), DBException);
  EXPECT_THROW(ImagePathCheck::check(savedRecord<DBPath>(1), std::make_shared<DBImage>()), DBException);
}
