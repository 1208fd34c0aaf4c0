#pragma once

#include <optional>
#include <string>

namespace dbcore {

// A column or sub-select reference that type checking writes into a condition tree in place of a
// column name: the column of the row under test (Source), the column of the joined table's row (Other),
// or the largest / smallest value of a column over a table (Max, Min).
//
// Its text starts with a NUL byte, which no condition token can hold, then a three-letter tag and NUL:
//   Source  "\0src\0" column
//   Other   "\0oth\0" table "\0" column
//   Max     "\0max\0" table "\0" column
//   Min     "\0min\0" table "\0" column
// Names are not empty and hold no NUL byte. The text only says which names a tree refers to; whoever
// renders it as SQL still checks the names against the engine's column tables.
class DBEngineReference {
 public:
  enum class Kind { Source, Other, Max, Min };

  Kind kind = Kind::Source;
  std::string table;  // empty for Source
  std::string column;

  // The reference's text in the layout above.
  std::string text() const;

  // The reference a text spells, or nothing for any other text (a literal, a column name, a text with
  // an unknown tag, an empty name or a stray NUL byte).
  static std::optional<DBEngineReference> parse(const std::string& text);

  bool operator==(const DBEngineReference& other) const = default;
};

}  // namespace dbcore
