#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

namespace dbcore {

// One value as SQLite holds it while it evaluates an expression: NULL, a 64-bit integer, a double or
// text, compared with the BINARY collation. A text of up to kInlineTextSize bytes is kept in the value
// itself (a copy of the value copies it, and reading it needs no other memory); a longer one is a view
// of bytes owned elsewhere (a DBSqlRow) and, like SQLite's own texts, shorter than 4 GiB. asText() views
// the value's own bytes for a short text: it is valid while the value lives. 16 bytes.
// The operations reproduce SQLite's (3.40) comparison rules so that a condition evaluated in memory
// answers what SQLite answers for the same values.
class DBSqlValue {
 public:
  enum class Class : uint8_t { Null, Integer, Real, Text };

  // The affinity a comparison applies to both of its operands: numeric when one side is a column of
  // numeric type, text when one side is a text column and the other has no affinity, none otherwise.
  enum class Affinity : uint8_t { None, Numeric, Text };

  // Room for the decimal text of any 64-bit integer.
  static constexpr std::size_t kIntegerTextSize = 24;
  static constexpr std::size_t kInlineTextSize = 8;

  DBSqlValue() = default;
  static DBSqlValue integer(int64_t value);
  // A NaN becomes NULL: SQLite keeps no NaN, and the catalog stores a NaN float field as NULL.
  static DBSqlValue real(double value);
  static DBSqlValue text(std::string_view bytes);

  Class storageClass() const { return class_; }
  bool isNull() const { return class_ == Class::Null; }
  int64_t asInteger() const { return payload_.integer; }
  double asReal() const { return payload_.real; }
  std::string_view asText() const { return {inline_ ? payload_.bytes : payload_.text, size_}; }
  // Whether the value is a text whose bytes live elsewhere.
  bool viewsText() const { return class_ == Class::Text && !inline_; }

  // The value as a condition: nothing for NULL, otherwise whether it is not zero (text by its leading
  // number, "2x" being 2 and "abc" 0).
  std::optional<bool> truth() const;

  // The value as the comparison's affinity leaves it: under numeric affinity text that is a well-formed
  // number becomes that number; under text affinity an integer becomes its decimal text, written into
  // `buffer`. Other values are returned unchanged.
  DBSqlValue withAffinity(Affinity affinity, char (&buffer)[kIntegerTextSize]) const;

  // SQLite's order of two values with no affinity applied: numbers by value (an integer and a real
  // exactly), every number before every text, texts by their bytes. Nothing when either is NULL.
  static std::optional<int> compare(const DBSqlValue& left, const DBSqlValue& right);

 private:
  union Payload {
    int64_t integer;
    double real;
    const char* text;
    char bytes[kInlineTextSize];
  };

  static int compareNumbers(const DBSqlValue& left, const DBSqlValue& right);
  static int compareIntegerWithReal(int64_t integer, double real);
  static int compareTexts(std::string_view left, std::string_view right);

  static_assert(sizeof(Payload) == kInlineTextSize);

  Payload payload_{0};
  uint32_t size_ = 0;
  Class class_ = Class::Null;
  bool inline_ = false;
};

}  // namespace dbcore
