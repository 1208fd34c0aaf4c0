#pragma once

#include <memory>
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

  // Inserts an unsaved record (assigning its id) or replaces the stored values of a saved one (inserting
  // it again under its id when its row is gone). Inserts and updates are separate statements: an upsert
  // that may rewrite foreign and unique keys makes SQLite journal every page the statement touches.
  template <class T>
  static void write(DBConnection& connection, T& record) {
    if (record.is_saved()) {
      writeColumns(*connection.prepare(updateSql<T>()), record);
      if (connection.changes() > 0) return;
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

  // Parameters numbered as in insertSql(): the id is ?1.
  template <class T>
  static const DBStaticSql& updateSql() {
    static const DBStaticSql sql([] {
      std::string assignments;
      int index = 0;
      for (const auto& column : T::all_columns()) {
        ++index;
        if (index > 1) assignments += std::string(column.name) + "=?" + std::to_string(index) + ",";
      }
      assignments.pop_back();
      return std::string("UPDATE ") + T::kTableName + " SET " + assignments + " WHERE " + kIdColumn + "=?1";
    }());
    return sql;
  }
};

}  // namespace dbcore
