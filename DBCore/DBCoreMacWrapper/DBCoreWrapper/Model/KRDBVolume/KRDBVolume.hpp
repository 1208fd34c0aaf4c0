#pragma once

#include <memory>

#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbvolume.hpp"

// One disk volume known to the catalog, over a dbcore::DBVolume record. Its values are cached from the record
// by its store hook; used on its context's thread.
class KRDBVolume
    : public KRDBConcreteEntity<KRDBVolume, KRDBEntity, KRDBEntityTypeVolume, dbcore::kDBVolumeType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBVolume(const std::shared_ptr<dbcore::DBVolume>& volume);
};
