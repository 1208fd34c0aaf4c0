#pragma once

#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// A smart collection: saved conditions over the catalog's images. The filter and applying conditions are
// JSON objects from condition kind (kImagesConditionKey, ...) to condition text.
class DBSmartFilter : public DBRecord<DBSmartFilter, kDBSmartFilterType> {
 public:
  static constexpr const char* kTableName = "smart_filters";
  static const std::vector<DBColumn<DBSmartFilter>>& columns();

  std::wstring identifier;
  std::wstring filter_conditions;
  std::wstring applying_conditions;
  std::wstring name;
};

extern template class DBRecord<DBSmartFilter, kDBSmartFilterType>;

}  // namespace dbcore
