#pragma once

#include <memory>
#include <vector>

#include "dbconnection.hpp"
#include "dbexception.hpp"
#include "dbrecordio.hpp"
#include "dbselectplan.hpp"
#include "dbselectquery.hpp"

namespace dbcore {

// Runs select queries on a connection (for DBReactor::GetBySelectQuery). The statement text depends
// only on the query's shape, never on its literal values, so the connection's statement cache reuses it.
class DBSelectQueryRunner {
 public:
  // The records of T the query selects, ordered by _id_int_64. First reads the values of the query's
  // max/min sub-selects and keeps them on the query for Result. Throws DBException for an empty query or
  // a query over another table.
  template <class T>
  static std::vector<std::shared_ptr<T>> run(DBConnection& connection,
                                             const std::shared_ptr<DBEntitySelectQuery>& query) {
    const std::shared_ptr<const DBSelectPlan> plan = planOf(query, T::kTableName);
    if (plan->selectsNothing()) return {};
    keepAggregates(connection, *query, plan);
    const DBStatementLease statement = connection.prepare(DBRecordIO::selectSql<T>() + plan->tail());
    bind(*statement, plan->parameters());
    return DBRecordIO::readAll<T>(*statement);
  }

 private:
  static std::shared_ptr<const DBSelectPlan> planOf(const std::shared_ptr<DBEntitySelectQuery>& query,
                                                    const std::string& table);
  static void keepAggregates(DBConnection& connection, DBEntitySelectQuery& query,
                             const std::shared_ptr<const DBSelectPlan>& plan);
  static void bind(DBStatement& statement, const DBSqlRow& parameters);
};

}  // namespace dbcore
