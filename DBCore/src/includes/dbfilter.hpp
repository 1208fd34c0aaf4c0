#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// A collection: a user-made group of images, one node of the collection tree.
class DBFilter : public DBRecord<DBFilter, kDBFilterType> {
 public:
  static constexpr const char* kTableName = "filters";
  static const std::vector<DBColumn<DBFilter>>& columns();

  std::wstring name;
  // Position among its siblings.
  float order = 0.0f;
};

extern template class DBRecord<DBFilter, kDBFilterType>;

}  // namespace dbcore
