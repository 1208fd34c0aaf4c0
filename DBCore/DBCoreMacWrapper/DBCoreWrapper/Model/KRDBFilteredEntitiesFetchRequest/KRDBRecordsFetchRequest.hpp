#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBFilteredEntitiesFetchRequest.hpp"

// The shape of the requests over one record kind: entities of type kEntityType, selected by a query of
// kind Query whose only condition keeps out the records of kind Record marked to delete. Self is the
// request class. Thread rule of KRDBFilteredEntitiesFetchRequest.
template <class Self, class Query, class Record, int64_t kEntityType>
class KRDBRecordsFetchRequest : public KRDBFilteredEntitiesFetchRequest {
 public:
  static std::shared_ptr<Self> init() { return std::make_shared<Self>(); }

  int64_t entityType() const override { return kEntityType; }
  SelectQueryPtr makeSelectQuery() override { return notMarkedToDeleteQuery<Query, Record>(std::string()); }
};
