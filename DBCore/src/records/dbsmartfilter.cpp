#include "dbsmartfilter.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBSmartFilter, kDBSmartFilterType>;

const std::vector<DBColumn<DBSmartFilter>>& DBSmartFilter::columns() {
  static const std::vector<DBColumn<DBSmartFilter>> columns{
      DBField<DBSmartFilter, &DBSmartFilter::identifier>("identifier_wide_ch"),
      DBField<DBSmartFilter, &DBSmartFilter::filter_conditions>("filter_conditions_wide_ch"),
      DBField<DBSmartFilter, &DBSmartFilter::applying_conditions>("applying_conditions_wide_ch"),
      DBField<DBSmartFilter, &DBSmartFilter::name>("name_wide_ch"),
  };
  return columns;
}

}  // namespace dbcore
