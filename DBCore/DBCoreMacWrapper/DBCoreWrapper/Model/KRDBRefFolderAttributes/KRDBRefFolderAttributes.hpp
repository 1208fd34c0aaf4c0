#pragma once

#include <memory>

#include "Model/KRDBBaseFolderAttributes/KRDBBaseFolderAttributes.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbreffolderattrib.hpp"

// The attribute record of a referenced folder, over a dbcore::DBRefFolderAttrib record. Its values are cached
// from the record by its store hook; used on its context's thread.
class KRDBRefFolderAttributes
    : public KRDBConcreteEntity<KRDBRefFolderAttributes, KRDBBaseFolderAttributes,
                                KRDBEntityTypeRefFolderAttributes, dbcore::kDBRefFolderAttribType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBAttrib(const std::shared_ptr<dbcore::DBRefFolderAttrib>& attributes);
};
