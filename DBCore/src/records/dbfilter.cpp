#include "dbfilter.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBFilter, kDBFilterType>;

const std::vector<DBColumn<DBFilter>>& DBFilter::columns() {
  static const std::vector<DBColumn<DBFilter>> columns{
      DBField<DBFilter, &DBFilter::name>("name_wide_ch"),
      DBField<DBFilter, &DBFilter::order>("order_float"),
  };
  return columns;
}

}  // namespace dbcore
