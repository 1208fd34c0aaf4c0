#pragma once

#include <memory>

#include "KRFoundation/KRMapTable.hpp"
#include "Model/KRDBEntity/KRDBEntityID.hpp"

// A map table keyed by entity identifiers, holding objects.
using KRDBEntityIDMapTable = KRMapTable<KRDBEntityIDPtr, std::shared_ptr<KRObject>>;

// Makes the identifier-keyed map tables of the caches, change sets and filters. Bound to its
// implementation through the injector service.
class KRDBDataStorageCreating {
 public:
  virtual ~KRDBDataStorageCreating() = default;
  // For identifiers of mixed types: keys equal when type and dbid are.
  virtual std::shared_ptr<KRDBEntityIDMapTable> makeMapTableWithObjectsMappedByEntityIDs() const = 0;
  // For identifiers that all have one type: keys equal and hashed by dbid alone.
  virtual std::shared_ptr<KRDBEntityIDMapTable> makeMapTableWithObjectsMappedBySameTypeEntityIDs() const = 0;
};
