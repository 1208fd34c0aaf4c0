#pragma once

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <string>
#include <vector>

#include "dbrecord.hpp"

// Float fields holding the values cameras write for 0/0 and x/0 rationals.
namespace nonfinite {

inline const std::vector<float> kValues = {std::numeric_limits<float>::quiet_NaN(),
                                           std::numeric_limits<float>::infinity(),
                                           -std::numeric_limits<float>::infinity()};

// Sets every float field of the record to the value.
template <class Record>
void setEveryFloat(Record& record, float value) {
  for (const auto& column : Record::all_columns()) {
    if (column.type == dbcore::FieldType::T_FLOAT) column.set(record, dbcore::TVariant(value));
  }
}

// Whether every float field of the record holds the value (any NaN for a NaN).
template <class Record>
testing::AssertionResult everyFloatIs(const Record& record, float value) {
  for (const auto& column : Record::all_columns()) {
    if (column.type != dbcore::FieldType::T_FLOAT) continue;
    const float held = column.get(record).asFloat();
    if (std::isnan(value) ? !std::isnan(held) : held != value) {
      return testing::AssertionFailure() << column.name << " holds " << held << " instead of " << value;
    }
  }
  return testing::AssertionSuccess();
}

}  // namespace nonfinite
