#include "dbpathselectquery.hpp"

#include "dbpath.hpp"

namespace dbcore {

DBPathSelectQuery::DBPathSelectQuery() : DBEntitySelectQuery(DBPath::kTableName) {}

}  // namespace dbcore
