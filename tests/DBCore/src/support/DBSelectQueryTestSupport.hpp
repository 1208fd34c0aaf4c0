#pragma once

#include <memory>
#include <string>
#include <vector>

#include "DBReactorTestSupport.hpp"
#include "dbclause.hpp"
#include "dbselectquery.hpp"

// Catalog tests of select queries: ids of what a query selects, and the in-memory answers for records.
class DBSelectQueryTestBase : public DBReactorTestBase {
 protected:
  template <class T>
  std::vector<long long> selectedIds(const std::shared_ptr<dbcore::DBEntitySelectQuery>& query) {
    std::vector<long long> ids;
    for (const auto& record : reactor->GetBySelectQuery<T>(query)) ids.push_back(record->id());
    return ids;
  }

  // The ids among `records` whose validation records satisfy the query.
  template <class T>
  static std::vector<long long> satisfyingIds(const std::shared_ptr<dbcore::DBEntitySelectQuery>& query,
                                              const std::vector<std::shared_ptr<T>>& records) {
    std::vector<long long> ids;
    dbcore::ColumnValues result;
    for (const auto& record : records) {
      if (query->Result(result, query->validationRecordForEntity(record))) ids.push_back(record->id());
    }
    return ids;
  }

  template <class T>
  static std::shared_ptr<dbcore::DBClause> where(const std::string& condition) {
    return std::make_shared<dbcore::DBClause>(dbcore::clauseWithCondition<T>(condition, false));
  }

  template <class T>
  static std::shared_ptr<dbcore::DBClause> joined(const std::string& condition) {
    return std::make_shared<dbcore::DBClause>(dbcore::clauseWithCondition<T>(condition, true));
  }
};
