#pragma once

#include <memory>

#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbfilter.hpp"

// A user-made collection of images, over a dbcore::DBFilter record. Its values are cached from the record by
// its store hook; used on its context's thread.
class KRDBCollection : public KRDBConcreteEntity<KRDBCollection, KRDBAbstractBaseFolder,
                                                 KRDBEntityTypeCollection, dbcore::kDBFilterType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBFilter(const std::shared_ptr<dbcore::DBFilter>& filter);
};
