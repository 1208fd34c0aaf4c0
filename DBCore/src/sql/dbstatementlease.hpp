#pragma once

#include "dbstatement.hpp"

namespace dbcore {

// A cached prepared statement lent for one use. While the lease lives nobody else may borrow the
// statement; when it ends, however it ends, the statement is reset and its bindings cleared, so that no
// statement stays busy and pins a read snapshot of the file. Moves, does not copy. Not thread-safe.
class DBStatementLease {
 public:
  // Takes the statement; throws DBException when it is already lent.
  explicit DBStatementLease(DBStatement& statement);
  ~DBStatementLease();
  DBStatementLease(DBStatementLease&& other) noexcept;
  DBStatementLease& operator=(DBStatementLease&&) = delete;
  DBStatementLease(const DBStatementLease&) = delete;
  DBStatementLease& operator=(const DBStatementLease&) = delete;

  DBStatement& operator*() const { return *statement_; }
  DBStatement* operator->() const { return statement_; }

 private:
  DBStatement* statement_;
};

}  // namespace dbcore
