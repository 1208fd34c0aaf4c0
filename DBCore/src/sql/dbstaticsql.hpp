#pragma once

#include <cstddef>
#include <string>

namespace dbcore {

// An SQL text of the engine's own that never changes while the program runs, kept in a static object:
//   static const DBStaticSql kSql("DELETE FROM images WHERE _id_int_64 = ?");
// Each one has a slot number of its own, by which connections find its prepared statement without
// hashing the text. Thread-safe.
class DBStaticSql {
 public:
  explicit DBStaticSql(std::string text);
  DBStaticSql(const DBStaticSql&) = delete;
  DBStaticSql& operator=(const DBStaticSql&) = delete;

  const std::string& text() const { return text_; }
  std::size_t slot() const { return slot_; }

 private:
  std::string text_;
  std::size_t slot_;
};

}  // namespace dbcore
