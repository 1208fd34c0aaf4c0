#pragma once

#include <memory>

#include "Model/KRDBBaseFolderAttributes/KRDBBaseFolderAttributes.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbsmartfilterattrib.hpp"

// The attribute record of a smart filter, over a dbcore::DBSmartFilterAttrib record. Its values are cached
// from the record by its store hook; used on its context's thread.
class KRDBSmartFilterAttributes
    : public KRDBConcreteEntity<KRDBSmartFilterAttributes, KRDBBaseFolderAttributes,
                                KRDBEntityTypeSmartFilterAttributes, dbcore::kDBSmartFilterAttribType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBAttrib(const std::shared_ptr<dbcore::DBSmartFilterAttrib>& attributes);
};
