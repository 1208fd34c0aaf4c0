#pragma once

#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// A resource file bound to history states, known by its name.
class DBResource : public DBRecord<DBResource, kDBResourceType> {
 public:
  static constexpr const char* kTableName = "history_resources";
  static const std::vector<DBColumn<DBResource>>& columns();

  std::wstring name;
};

extern template class DBRecord<DBResource, kDBResourceType>;

}  // namespace dbcore
