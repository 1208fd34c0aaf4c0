#include "dbstatement.hpp"

#include <cmath>
#include <limits>

#include "KRFoundation/KRUTF.hpp"
#include "dbexception.hpp"
#include "dbstrings.hpp"

namespace dbcore {

DBStatement::DBStatement(sqlite3* db, const std::string& sql) : db_(db) {
  const int code = sqlite3_prepare_v3(db_, sql.c_str(), static_cast<int>(sql.size()),
                                      SQLITE_PREPARE_PERSISTENT, &statement_, nullptr);
  if (code != SQLITE_OK) fail(code);
}

DBStatement::~DBStatement() { sqlite3_finalize(statement_); }

DBStatement& DBStatement::reset() {
  sqlite3_reset(statement_);
  sqlite3_clear_bindings(statement_);
  return *this;
}

void DBStatement::lend() {
  if (leased_) throw DBException(std::string("A statement is lent twice: ") + sqlite3_sql(statement_));
  leased_ = true;
}

void DBStatement::giveBack() {
  reset();
  leased_ = false;
}

DBStatement& DBStatement::bind(int index, int64_t value) {
  const int code = sqlite3_bind_int64(statement_, index, value);
  if (code != SQLITE_OK) fail(code);
  return *this;
}

DBStatement& DBStatement::bind(int index, const std::string& text) {
  const int code =
      sqlite3_bind_text64(statement_, index, text.data(), text.size(), SQLITE_TRANSIENT, SQLITE_UTF8);
  if (code != SQLITE_OK) fail(code);
  return *this;
}

DBStatement& DBStatement::bindNull(int index) {
  const int code = sqlite3_bind_null(statement_, index);
  if (code != SQLITE_OK) fail(code);
  return *this;
}

DBStatement& DBStatement::bind(int index, const TVariant& value) {
  switch (value.type()) {
    case FieldType::T_NONE:
      return bindNull(index);
    case FieldType::T_FLOAT:
      return bindDouble(index, value.asDouble());
    case FieldType::T_TEXT:
      return bind(index, value.asText());
    case FieldType::T_WIDE_TEXT:
      return bind(index, ws2s(value.asWideText()));
    default:
      return bind(index, value.asInt64());
  }
}

DBStatement& DBStatement::bindDouble(int index, double value) {
  if (std::isnan(value)) return bindNull(index);
  const int code = sqlite3_bind_double(statement_, index, value);
  if (code != SQLITE_OK) fail(code);
  return *this;
}

DBStatement& DBStatement::bindWide(int index, const std::wstring& text) {
  buffer_.clear();
  KRUTF::appendUTF8(buffer_, text);
  return bind(index, buffer_);
}

bool DBStatement::step() {
  const int code = sqlite3_step(statement_);
  if (code == SQLITE_ROW) return true;
  if (code == SQLITE_DONE) return false;
  sqlite3_reset(statement_);
  fail(code);
}

void DBStatement::execute() {
  while (step()) {
  }
}

int64_t DBStatement::columnInt64(int column) const { return sqlite3_column_int64(statement_, column); }

double DBStatement::columnDouble(int column) const { return sqlite3_column_double(statement_, column); }

std::string DBStatement::columnText(int column) const {
  const auto* text = reinterpret_cast<const char*>(sqlite3_column_text(statement_, column));
  const int size = sqlite3_column_bytes(statement_, column);
  return text ? std::string(text, static_cast<size_t>(size)) : std::string();
}

bool DBStatement::columnIsNull(int column) const {
  return sqlite3_column_type(statement_, column) == SQLITE_NULL;
}

TVariant DBStatement::column(int column, FieldType type) const {
  switch (type) {
    case FieldType::T_BOOL:
      return TVariant(columnInt64(column) != 0);
    case FieldType::T_INT:
    case FieldType::T_UINT:
      return TVariant(static_cast<int32_t>(columnInt64(column)));
    case FieldType::T_INT_64:
      return TVariant(columnInt64(column));
    case FieldType::T_FLOAT:
      return TVariant(columnIsNull(column) ? std::numeric_limits<float>::quiet_NaN()
                                           : static_cast<float>(columnDouble(column)));
    case FieldType::T_TEXT:
      return TVariant(columnText(column));
    case FieldType::T_WIDE_TEXT:
      return TVariant(s2ws(columnText(column)));
    case FieldType::T_NONE:
      break;
  }
  return TVariant();
}

void DBStatement::fail(int code) const {
  throw DBException(std::string(sqlite3_errstr(code)) + ": " + sqlite3_errmsg(db_),
                    sqlite3_extended_errcode(db_));
}

}  // namespace dbcore
