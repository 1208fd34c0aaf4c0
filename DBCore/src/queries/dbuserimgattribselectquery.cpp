#include "dbuserimgattribselectquery.hpp"

#include "dbuserimgattrib.hpp"

namespace dbcore {

DBUserImgAttribSelectQuery::DBUserImgAttribSelectQuery() : DBEntitySelectQuery(DBUserImgAttrib::kTableName) {}

}  // namespace dbcore
