#include "dbsqltextnumber.hpp"

#include <gtest/gtest.h>
#include <sqlite3.h>

#include <cmath>
#include <cstring>
#include <random>
#include <string>
#include <vector>

using namespace dbcore;

namespace {

// SQLite itself as the reference: numeric affinity through a NUMERIC column, truth through CASE WHEN.
class SqliteReference {
 public:
  SqliteReference() {
    sqlite3_open(":memory:", &db_);
    sqlite3_exec(db_, "CREATE TABLE n(v NUMERIC)", nullptr, nullptr, nullptr);
    sqlite3_prepare_v2(db_, "INSERT INTO n VALUES (?)", -1, &insert_, nullptr);
    sqlite3_prepare_v2(db_, "SELECT typeof(v), v FROM n", -1, &select_, nullptr);
    sqlite3_prepare_v2(db_, "SELECT CASE WHEN ? THEN 1 ELSE 0 END", -1, &truth_, nullptr);
  }
  ~SqliteReference() {
    for (sqlite3_stmt* statement : {insert_, select_, truth_}) sqlite3_finalize(statement);
    sqlite3_close(db_);
  }

  // What a NUMERIC column stores for the text: "integer <n>", "real <bits>" or "text".
  std::string stored(const std::string& text) {
    sqlite3_exec(db_, "DELETE FROM n", nullptr, nullptr, nullptr);
    sqlite3_bind_text(insert_, 1, text.data(), static_cast<int>(text.size()), SQLITE_TRANSIENT);
    sqlite3_step(insert_);
    sqlite3_reset(insert_);
    sqlite3_step(select_);
    const std::string type = reinterpret_cast<const char*>(sqlite3_column_text(select_, 0));
    std::string result = type;
    if (type == "integer") result += " " + std::to_string(sqlite3_column_int64(select_, 1));
    if (type == "real") result += " " + bitsOf(sqlite3_column_double(select_, 1));
    sqlite3_reset(select_);
    return result;
  }

  bool truth(const std::string& text) {
    sqlite3_bind_text(truth_, 1, text.data(), static_cast<int>(text.size()), SQLITE_TRANSIENT);
    sqlite3_step(truth_);
    const bool result = sqlite3_column_int(truth_, 0) != 0;
    sqlite3_reset(truth_);
    return result;
  }

  static std::string bitsOf(double value) {
    uint64_t bits = 0;
    std::memcpy(&bits, &value, sizeof bits);
    return std::to_string(bits);
  }

 private:
  sqlite3* db_ = nullptr;
  sqlite3_stmt* insert_ = nullptr;
  sqlite3_stmt* select_ = nullptr;
  sqlite3_stmt* truth_ = nullptr;
};

// The same description from our conversion. A NUMERIC column also stores a whole real as an integer.
std::string storedByUs(const std::string& text) {
  const std::optional<DBSqlValue> number = DBSqlTextNumber::numeric(text);
  if (!number) return "text";
  if (number->storageClass() == DBSqlValue::Class::Integer) {
    return "integer " + std::to_string(number->asInteger());
  }
  const double real = number->asReal();
  constexpr double kTwoTo63 = 9223372036854775808.0;
  if (real > -kTwoTo63 && real < kTwoTo63 && real == std::trunc(real)) {
    return "integer " + std::to_string(static_cast<int64_t>(real));
  }
  return "real " + SqliteReference::bitsOf(real);
}

std::vector<std::string> edgeTexts() {
  return {"",
          " ",
          "0",
          "-0",
          "+0",
          "0.0",
          "-0.0",
          "1",
          " 12 ",
          "\t7\n",
          "12abc",
          "abc",
          "0x10",
          "1e",
          "1e+",
          "1.",
          ".5",
          ".",
          "-",
          "+",
          "1.5e",
          "1.5e3",
          "1E3",
          "1e-3",
          "2x",
          " -3.5e2abc",
          "1e999",
          "-1e999",
          "1e-330",
          "1e-320",
          "4.9e-324",
          "2.4703282292062327e-324",
          "1.7976931348623157e308",
          "9223372036854775807",
          "9223372036854775808",
          "-9223372036854775808",
          "-9223372036854775809",
          "99999999999999999999",
          "0.1",
          "0.30000000000000004",
          "123456789012345678901234567890",
          "000000000000000000000000001",
          "1.000000000000000000001",
          "3.14159265358979323846264338327950288",
          "1e308",
          "1e309",
          "1e-307",
          "1e-308",
          "1e-341",
          "1e-342",
          "922337203685477580.7e1",
          "1 2",
          std::string("1\0", 2),
          "١٢٣"};
}

std::string randomText(std::mt19937_64& random) {
  static const std::string alphabet = "0123456789000011119999..eE+-  \tax";
  std::uniform_int_distribution<size_t> length(0, 30);
  std::uniform_int_distribution<size_t> pick(0, alphabet.size() - 1);
  std::string text(length(random), ' ');
  for (char& c : text) c = alphabet[pick(random)];
  return text;
}

std::string randomDigits(std::mt19937_64& random, size_t count) {
  std::uniform_int_distribution<int> digit(0, 9);
  std::string digits;
  for (size_t i = 0; i < count; ++i) digits += static_cast<char>('0' + digit(random));
  return digits;
}

// [-]digits[.digits][e[-]exponent], with long mantissas and exponents near the double range's ends.
std::string randomDecimal(std::mt19937_64& random) {
  std::uniform_int_distribution<size_t> length(0, 25);
  std::uniform_int_distribution<int> exponent(-360, 360);
  std::bernoulli_distribution coin;
  std::string text = coin(random) ? "-" : "";
  text += randomDigits(random, length(random) + 1);
  if (coin(random)) text += "." + randomDigits(random, length(random));
  if (coin(random)) text += "e" + std::to_string(exponent(random));
  return text;
}

}  // namespace

TEST(DBSqlTextNumberTest, WholeNumbersBecomeIntegers) {
  EXPECT_EQ(DBSqlTextNumber::numeric(" 12 ")->asInteger(), 12);
  EXPECT_EQ(DBSqlTextNumber::numeric("-9223372036854775808")->asInteger(), INT64_MIN);
  EXPECT_EQ(DBSqlTextNumber::numeric("9223372036854775808")->storageClass(), DBSqlValue::Class::Real);
}

TEST(DBSqlTextNumberTest, RealsAndNonNumbers) {
  EXPECT_DOUBLE_EQ(DBSqlTextNumber::numeric("1.5e3")->asReal(), 1500.0);
  EXPECT_FALSE(DBSqlTextNumber::numeric("12abc"));
  EXPECT_FALSE(DBSqlTextNumber::numeric("0x10"));
  EXPECT_FALSE(DBSqlTextNumber::numeric("1e"));
  EXPECT_FALSE(DBSqlTextNumber::numeric(""));
}

TEST(DBSqlTextNumberTest, LeadingValueReadsThePrefix) {
  EXPECT_EQ(DBSqlTextNumber::leadingValue("2x"), 2.0);
  EXPECT_EQ(DBSqlTextNumber::leadingValue("abc"), 0.0);
  EXPECT_EQ(DBSqlTextNumber::leadingValue(" -3.5e2abc"), -350.0);
}

TEST(DBSqlTextNumberTest, AgreesWithSqliteOnEdgeCases) {
  SqliteReference sqlite;
  for (const std::string& text : edgeTexts()) {
    EXPECT_EQ(storedByUs(text), sqlite.stored(text)) << "text: [" << text << "]";
    EXPECT_EQ(DBSqlTextNumber::leadingValue(text) != 0.0, sqlite.truth(text)) << "text: [" << text << "]";
  }
}

TEST(DBSqlTextNumberTest, AgreesWithSqliteOnRandomTexts) {
  SqliteReference sqlite;
  std::mt19937_64 random(20240611);
  for (int round = 0; round < 40000; ++round) {
    const std::string text = round % 2 ? randomText(random) : randomDecimal(random);
    ASSERT_EQ(storedByUs(text), sqlite.stored(text)) << "text: [" << text << "]";
    ASSERT_EQ(DBSqlTextNumber::leadingValue(text) != 0.0, sqlite.truth(text)) << "text: [" << text << "]";
  }
}
