#include "dbresource.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBResource, kDBResourceType>;

const std::vector<DBColumn<DBResource>>& DBResource::columns() {
  static const std::vector<DBColumn<DBResource>> columns{
      DBField<DBResource, &DBResource::name>("name_wide_ch"),
  };
  return columns;
}

}  // namespace dbcore
