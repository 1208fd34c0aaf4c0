#pragma once

#include <cstdint>
#include <memory>

#include "Model/KRDBEntity/KRDBDataStorageCreating.hpp"

// Key functions of the identifier-keyed map tables.
bool KRManyTypeEntityIDsIsEqualFunction(const KRDBEntityIDPtr& a, const KRDBEntityIDPtr& b);
bool KROneTypeEntityIDsIsEqualFunction(const KRDBEntityIDPtr& a, const KRDBEntityIDPtr& b);
uint64_t KROneTypeEntityIDsHashFunction(const KRDBEntityIDPtr& entityID);

// The map tables keyed by entity identifiers. The tables are not synchronised: each owner keeps its
// table on one queue. The factory itself is stateless and thread-safe.
class KRDBDataStorageFactoryBase : public KRDBDataStorageCreating {
 public:
  // Empty tables: mixed-type keys hash by the identifier's own hash; same-type keys by the bare dbid.
  static std::shared_ptr<KRDBEntityIDMapTable> mapTableWithObjectsMappedByEntityIDs();
  static std::shared_ptr<KRDBEntityIDMapTable> mapTableWithObjectsMappedBySameTypeEntityIDs();

  std::shared_ptr<KRDBEntityIDMapTable> makeMapTableWithObjectsMappedByEntityIDs() const override;
  std::shared_ptr<KRDBEntityIDMapTable> makeMapTableWithObjectsMappedBySameTypeEntityIDs() const override;
};
