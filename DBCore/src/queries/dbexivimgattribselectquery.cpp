#include "dbexivimgattribselectquery.hpp"

#include "dbexivimgattrib.hpp"

namespace dbcore {

DBExivImgAttribSelectQuery::DBExivImgAttribSelectQuery() : DBEntitySelectQuery(DBExivImgAttrib::kTableName) {}

}  // namespace dbcore
