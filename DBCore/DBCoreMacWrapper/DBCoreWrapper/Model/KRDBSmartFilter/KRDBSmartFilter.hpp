#pragma once

#include <memory>

#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbsmartfilter.hpp"

// A saved set of conditions, over a dbcore::DBSmartFilter record. Its values are cached from the record by
// its store hook; used on its context's thread.
class KRDBSmartFilter : public KRDBConcreteEntity<KRDBSmartFilter, KRDBAbstractBaseFolder,
                                                  KRDBEntityTypeSmartFilter, dbcore::kDBSmartFilterType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBSmartFilter(const std::shared_ptr<dbcore::DBSmartFilter>& smartFilter);
};
