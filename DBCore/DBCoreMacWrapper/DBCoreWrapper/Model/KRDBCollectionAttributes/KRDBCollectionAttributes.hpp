#pragma once

#include <memory>

#include "Model/KRDBBaseFolderAttributes/KRDBBaseFolderAttributes.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbfilterattrib.hpp"

// The attribute record of a collection, over a dbcore::DBFilterAttrib record. Its values are cached from the
// record by its store hook; used on its context's thread.
class KRDBCollectionAttributes
    : public KRDBConcreteEntity<KRDBCollectionAttributes, KRDBBaseFolderAttributes,
                                KRDBEntityTypeCollectionAttributes, dbcore::kDBFilterAttribType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBAttrib(const std::shared_ptr<dbcore::DBFilterAttrib>& attributes);
};
