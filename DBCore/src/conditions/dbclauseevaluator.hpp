#pragma once

#include <cstdint>

#include "dbclauseprogram.hpp"
#include "dbsqlrow.hpp"
#include "dbvalidationrecord.hpp"

namespace dbcore {

// Evaluates a compiled condition on one validation record, with SQLite's semantics: comparisons apply
// the affinity the compiler chose and compare as DBSqlValue does, a comparison with NULL is NULL, && and
// || follow SQLite's three-valued logic, and the record passes only when the condition is true.
// Reads only its arguments: any number of evaluators may run at once. Allocates nothing.
class DBClauseEvaluator {
 public:
  // `aggregates` holds the values of the program's max/min sub-selects in aggregate order; null makes
  // them all NULL.
  DBClauseEvaluator(const DBClauseProgram& program, const DBValidationRecord& record,
                    const DBSqlRow* aggregates)
      : program_(program), record_(record), aggregates_(aggregates) {}

  // Whether SQLite would select the record: the program is not rejected, the record has its own row and
  // a row in every related table of `joinedSlots` (bit n: related table n) and of the program, and the
  // condition is true.
  bool satisfied(uint32_t joinedSlots) const;

 private:
  bool hasRows(uint32_t slots) const;
  DBSqlValue value(int32_t node) const;
  DBSqlValue compare(const DBClauseProgram::Node& node) const;
  DBSqlValue logical(const DBClauseProgram::Node& node) const;

  const DBClauseProgram& program_;
  const DBValidationRecord& record_;
  const DBSqlRow* aggregates_;
};

}  // namespace dbcore
