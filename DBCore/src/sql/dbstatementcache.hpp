#pragma once

#include <cstddef>
#include <list>
#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

#include "dbstatement.hpp"
#include "dbstaticsql.hpp"

struct sqlite3;

namespace dbcore {

// The prepared statements of one connection. Statements of static SQL (DBStaticSql) are kept for the
// life of the connection, found by their slot. Statements of generated SQL (select queries, whose text
// follows the query's shape) are kept by text, at most kGeneratedCapacity of them: the one used least
// recently goes first, unless it is lent. Not thread-safe: used on the connection's queue.
class DBStatementCache {
 public:
  static constexpr std::size_t kGeneratedCapacity = 256;

  explicit DBStatementCache(sqlite3* db) : db_(db) {}
  DBStatementCache(const DBStatementCache&) = delete;
  DBStatementCache& operator=(const DBStatementCache&) = delete;

  // The statement of the SQL, prepared on first use. Throws DBException when the SQL does not prepare.
  DBStatement& statement(const DBStaticSql& sql);
  DBStatement& statement(const std::string& sql);

  std::size_t generatedCount() const { return generated_.size(); }
  // Finalizes every statement; none may be lent.
  void clear();

 private:
  using Generated = std::list<std::pair<std::string, std::unique_ptr<DBStatement>>>;

  void evictUnused();

  sqlite3* db_;
  std::vector<std::unique_ptr<DBStatement>> fixed_;
  // Most recently used first.
  Generated generated_;
  std::unordered_map<std::string, Generated::iterator> generatedByText_;
};

}  // namespace dbcore
