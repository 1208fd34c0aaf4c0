#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace dbcore {
class DBEntity;
}
class KRDBEntity;

// What the registry knows of one concrete entity class: both type numbers, how to build an instance over
// an engine record, and the properties that must be present before an instance is complete.
struct KRDBEntityClass {
  int64_t entityType;
  uint8_t dbEntityType;
  std::shared_ptr<KRDBEntity> (*initWithDBEntity)(const std::shared_ptr<dbcore::DBEntity>& record);
  const std::vector<std::string>& (*necessaryLinkedEntitiesKeys)();
};
