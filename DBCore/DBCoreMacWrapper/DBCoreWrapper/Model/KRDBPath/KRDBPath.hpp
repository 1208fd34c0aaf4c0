#pragma once

#include <memory>

#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbpath.hpp"

// One folder on disk that holds catalog images, over a dbcore::DBPath record. Its values are cached from the
// record by its store hook; used on its context's thread.
class KRDBPath : public KRDBConcreteEntity<KRDBPath, KRDBEntity, KRDBEntityTypePath, dbcore::kDBPathType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBPath(const std::shared_ptr<dbcore::DBPath>& path);
};
