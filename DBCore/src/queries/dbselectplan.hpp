#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "dbclauseprogram.hpp"
#include "dbselectquery.hpp"
#include "dbsqlrow.hpp"
#include "tvariant.hpp"

namespace dbcore {

// How a select query reads records of one table: what follows "SELECT <columns> FROM <table>" (the
// joins of the related tables it reads, the WHERE conditions and "ORDER BY <table>._id_int_64") and the
// values of its parameters, plus its compiled conditions for in-memory evaluation. Immutable.
//
//   SELECT images.<columns> FROM images
//     JOIN image_user_attributes ON image_user_attributes.image_id_int_64 = images._id_int_64
//     WHERE <clause> AND <join clause> AND <restriction> ORDER BY images._id_int_64
class DBSelectPlan {
 public:
  // `joinedSlots`: related tables (bit n: related table n) joined even when no clause reads them.
  DBSelectPlan(std::string table, DBClauseProgram program, uint32_t joinedSlots,
               const std::vector<DBSelectRestriction>& restrictions);

  const std::string& table() const { return table_; }
  const DBClauseProgram& program() const { return program_; }
  bool selectsNothing() const { return program_.rejected(); }
  // Every related table the SQL joins: a record without a row in one of them is not selected.
  uint32_t joinedSlots() const { return joinedSlots_; }
  const std::string& tail() const { return tail_; }
  const DBSqlRow& parameters() const { return parameters_; }

 private:
  std::string joins() const;
  std::string conditions(const std::vector<DBSelectRestriction>& restrictions) const;
  DBSqlRow parametersOf(const std::vector<DBSelectRestriction>& restrictions) const;

  std::string table_;
  DBClauseProgram program_;
  uint32_t joinedSlots_;
  std::string tail_;
  DBSqlRow parameters_;
};

}  // namespace dbcore
