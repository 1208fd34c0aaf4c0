#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "dbconnection.hpp"
#include "dbexception.hpp"
#include "dbrecord.hpp"

namespace dbcore {

// Reads and writes records of any record type through the record type's column list. Column names and
// table names come only from the record definitions; values are always bound.
class DBRecordIO {
 public:
  // "SELECT <every column> FROM <table>", to be followed by the caller's own clauses.
  template <class T>
  static const std::string& selectSql() {
    static const std::string sql = [] {
      std::string text = "SELECT ";
      for (const auto& column : T::all_columns())
        text += std::string(T::kTableName) + "." + column.name + ",";
      text.back() = ' ';
      return text + "FROM " + T::kTableName;
    }();
    return sql;
  }

  // The record in the current row of a statement made from selectSql().
  template <class T>
  static std::shared_ptr<T> read(const DBStatement& statement) {
    auto record = std::make_shared<T>();
    int index = 0;
    for (const auto& column : T::all_columns()) column.set(*record, statement.column(index++, column.type));
    return record;
  }

  // Every remaining row of a statement made from selectSql().
  template <class T>
  static std::vector<std::shared_ptr<T>> readAll(DBStatement& statement) {
    std::vector<std::shared_ptr<T>> records;
    while (statement.step()) records.push_back(read<T>(statement));
    return records;
  }

  // The first row only, or an empty pointer.
  template <class T>
  static std::shared_ptr<T> readOne(DBStatement& statement) {
    return statement.step() ? read<T>(statement) : nullptr;
  }

  template <class T>
  static std::shared_ptr<T> get(DBConnection& connection, int64_t id) {
    static const DBStaticSql kSql(selectSql<T>() + " WHERE _id_int_64 = ?");
    return getWhere<T>(connection, kSql, id);
  }

  // The first record that a select of T (selectSql() with a condition of one parameter) gives for the value.
  template <class T>
  static std::shared_ptr<T> getWhere(DBConnection& connection, const DBStaticSql& sql, int64_t value) {
    const DBStatementLease statement = connection.prepare(sql);
    statement->bind(1, value);
    return readOne<T>(*statement);
  }

  // Inserts an unsaved record (assigning its id) or writes the stored values of a saved one (inserting it
  // again under its id when its row is gone). A saved record's row is read first and only the columns
  // whose values differ are assigned: every assigned column costs the upkeep of its indexes (attribute
  // tables index most of their columns), and a link to an owner record left unassigned spares SQLite a
  // foreign-key check. Either way one statement changes the row, so a write is atomic on its own.
  template <class T>
  static void write(DBConnection& connection, T& record) {
    if (record.is_saved()) {
      if (const auto changed = changedColumns(connection, record)) {
        if (*changed != 0) updateColumns(connection, record, *changed);
        return;
      }
    }
    writeColumns(*connection.prepare(insertSql<T>()), record);
    if (!record.is_saved()) record.set_id(connection.lastInsertRowId());
  }

  // Deletes the record's row; true when there was one.
  template <class T>
  static bool remove(DBConnection& connection, const T& record) {
    static const DBStaticSql kSql(std::string("DELETE FROM ") + T::kTableName + " WHERE _id_int_64 = ?");
    connection.prepare(kSql)->bind(1, record.id()).execute();
    return connection.changes() > 0;
  }

 private:
  // Binds every column (the id, first, as NULL for an unsaved record) and runs the statement.
  template <class T>
  static void writeColumns(DBStatement& statement, const T& record) {
    int index = 1;
    for (const auto& column : T::all_columns()) column.bind(statement, index++, record);
    if (!record.is_saved()) statement.bindNull(1);
    statement.execute();
  }

  template <class T>
  static const DBStaticSql& insertSql() {
    static const DBStaticSql sql([] {
      std::string names;
      std::string values;
      for (const auto& column : T::all_columns()) {
        names += std::string(column.name) + ",";
        values += "?,";
      }
      names.pop_back();
      values.pop_back();
      return std::string("INSERT INTO ") + T::kTableName + "(" + names + ") VALUES(" + values + ")";
    }());
    return sql;
  }

  // The columns (bit i for column i of T::all_columns(), never the id) whose stored values differ from the
  // record's; nothing when the record's row is gone.
  template <class T>
  static std::optional<uint64_t> changedColumns(DBConnection& connection, const T& record) {
    if (T::all_columns().size() > 64)
      throw DBException(std::string("Too many columns to compare in ") + T::kTableName);
    static const DBStaticSql kSql(selectSql<T>() + " WHERE " + kIdColumn + " = ?");
    const DBStatementLease statement = connection.prepare(kSql);
    statement->bind(1, record.id());
    if (!statement->step()) return std::nullopt;
    uint64_t changed = 0;
    int index = 0;
    for (const auto& column : T::all_columns()) {
      if (index > 0 && !(statement->column(index, column.type) == column.get(record)))
        changed |= uint64_t{1} << index;
      ++index;
    }
    return changed;
  }

  // Assigns the given columns of the record's row; parameters numbered as in insertSql() (the id is ?1).
  template <class T>
  static void updateColumns(DBConnection& connection, const T& record, uint64_t columns) {
    std::string assignments;
    int index = 0;
    for (const auto& column : T::all_columns()) {
      if ((columns >> index & 1) != 0) {
        assignments +=
            std::string(assignments.empty() ? "" : ",") + column.name + "=?" + std::to_string(index + 1);
      }
      ++index;
    }
    const DBStatementLease statement = connection.prepare(std::string("UPDATE ") + T::kTableName + " SET " +
                                                          assignments + " WHERE " + kIdColumn + "=?1");
    index = 0;
    for (const auto& column : T::all_columns()) {
      if (index == 0 || (columns >> index & 1) != 0) column.bind(*statement, index + 1, record);
      ++index;
    }
    statement->execute();
  }
};

}  // namespace dbcore
