#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

#include "dbsqlvalue.hpp"

namespace dbcore {

// Reads numbers out of text exactly as SQLite 3.40 does (its sqlite3AtoF and sqlite3Atoi64): the
// conversions behind numeric affinity and behind text used as a condition.
class DBSqlTextNumber {
 public:
  // The number SQLite's numeric affinity makes of the text: an integer when the text is a whole number
  // that fits in 64 bits, otherwise a real; nothing when the text is not a well-formed number (white
  // space around it is allowed; "12abc", "0x10" and "1e" are not numbers).
  static std::optional<DBSqlValue> numeric(std::string_view text);

  // The value of the number the text starts with, 0 when it starts with none ("2x" is 2).
  static double leadingValue(std::string_view text);

 private:
  // What sqlite3AtoF reads: its verdict (1 a whole number, 2 or more a real, 0 or less not a number) and
  // the value of the longest number at the start.
  struct Reading {
    int verdict;
    double value;
  };

  static Reading read(std::string_view text);
  static std::optional<int64_t> wholeNumber(std::string_view text);
};

}  // namespace dbcore
