#include "dbresource.hpp"

namespace dbcore {

const std::vector<DBColumn<DBResource>>& DBResource::columns() {
  static const std::vector<DBColumn<DBResource>> columns{
      DBField<DBResource, &DBResource::name>("name_wide_ch"),
  };
  return columns;
}

}  // namespace dbcore
