#pragma once

#include <sqlite3.h>

#include <functional>
#include <string>

#include "dbstatementcache.hpp"
#include "dbstatementlease.hpp"
#include "dbstaticsql.hpp"

namespace dbcore {

// One SQLite connection with a cache of prepared statements. Not thread-safe: used on one queue.
class DBConnection {
 public:
  // Opens (creating when missing) the file defensively: defensive mode on, untrusted schema, WAL journal
  // where the file allows it, foreign keys on. Throws DBException when the file cannot be opened.
  explicit DBConnection(const std::string& path);
  ~DBConnection();
  DBConnection(const DBConnection&) = delete;
  DBConnection& operator=(const DBConnection&) = delete;

  // Runs SQL text of the engine's own (never built from outside input) with no results.
  void exec(const std::string& sql);
  // The cached prepared statement of the engine's own static SQL, lent ready to bind. Throws
  // DBException when it is already lent.
  DBStatementLease prepare(const DBStaticSql& sql);
  // The same for generated SQL (select queries), from a cache of bounded size.
  DBStatementLease prepare(const std::string& sql);
  // One integer from a query returning one row and column (0 when there is no row); the SQL is static
  // or generated, as for prepare().
  template <class Sql>
  int64_t queryInt64(const Sql& sql) {
    const DBStatementLease statement = prepare(sql);
    return statement->step() ? statement->columnInt64(0) : 0;
  }

  // Runs the body atomically: in a transaction, or a savepoint when one is already open. An exception
  // leaving the body rolls back everything it wrote and passes on.
  void transaction(const std::function<void()>& body);
  // Runs the body in one transaction that the body's own transactions join as savepoints, and commits it
  // when the body ends, also when the body throws: each of those transactions has already rolled back
  // what it wrote itself, so what completed is kept, and the exception passes on. Inside an open
  // transaction the body simply joins it. Throws DBException, after rolling back, when the commit fails.
  void commitTogether(const std::function<void()>& body);
  bool inTransaction() const { return transactionDepth_ > 0; }
  // Runs a body that changes the database with at most one statement: in a transaction of its own when
  // none is open; inside an open one directly, since the statement is atomic by itself (a savepoint per
  // record would cost more than the record's write).
  void singleChange(const std::function<void()>& body);

  int64_t lastInsertRowId() const { return sqlite3_last_insert_rowid(db_); }
  int changes() const { return sqlite3_changes(db_); }
  sqlite3* handle() const { return db_; }
  const DBStatementCache& statements() const { return statements_; }

 private:
  void configure();
  void commit();

  sqlite3* db_ = nullptr;
  DBStatementCache statements_;
  int transactionDepth_ = 0;
};

}  // namespace dbcore
