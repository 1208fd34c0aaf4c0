#include "dbentityreffolderselectquery.hpp"

#include "dbreffolder.hpp"

namespace dbcore {

DBEntityReffolderSelectQuery::DBEntityReffolderSelectQuery() : DBEntitySelectQuery(DBRefFolder::kTableName) {}

}  // namespace dbcore
