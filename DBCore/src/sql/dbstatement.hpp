#pragma once

#include <sqlite3.h>

#include <cstdint>
#include <string>

#include "tvariant.hpp"

namespace dbcore {

// One prepared SQLite statement. Binding indexes start at 1, column indexes at 0. Errors throw DBException.
class DBStatement {
 public:
  DBStatement(sqlite3* db, const std::string& sql);
  ~DBStatement();
  DBStatement(const DBStatement&) = delete;
  DBStatement& operator=(const DBStatement&) = delete;

  // Clears bindings and rewinds, ready for a new execution.
  DBStatement& reset();

  // Marks the statement lent (DBStatementLease); throws DBException when it already is.
  void lend();
  // Ends a loan: resets the statement and marks it free.
  void giveBack();
  bool leased() const { return leased_; }
  DBStatement& bind(int index, int64_t value);
  DBStatement& bind(int index, const std::string& text);
  DBStatement& bind(int index, const TVariant& value);
  // SQLite keeps no NaN: a NaN binds NULL, as sqlite3_bind_double would make it. Infinities bind as they are.
  DBStatement& bindDouble(int index, double value);
  // Binds wide text as UTF-8, converted through a buffer the statement keeps.
  DBStatement& bindWide(int index, const std::wstring& text);
  DBStatement& bindNull(int index);

  // Advances to the next row; false when there are no more rows.
  bool step();
  // Runs a statement that returns no rows.
  void execute();

  int64_t columnInt64(int column) const;
  double columnDouble(int column) const;
  std::string columnText(int column) const;
  bool columnIsNull(int column) const;
  // The column read as a value of the given field type. A float column's NULL reads as NaN, the value it
  // stands for.
  TVariant column(int column, FieldType type) const;

 private:
  [[noreturn]] void fail(int code) const;

  sqlite3* db_;
  sqlite3_stmt* statement_ = nullptr;
  std::string buffer_;
  bool leased_ = false;
};

}  // namespace dbcore
