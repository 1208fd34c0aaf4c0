#pragma once

#include "Model/KRDBBaseFolderAttributes/KRDBConcreteFolderAttributes.hpp"
#include "dbreffolderattrib.hpp"

// The attribute record of a referenced folder, over a dbcore::DBRefFolderAttrib record: favorite flag and
// selected filter types, both stored. Used on its context's thread.
class KRDBRefFolderAttributes
    : public KRDBConcreteFolderAttributes<KRDBRefFolderAttributes, dbcore::DBRefFolderAttrib,
                                          KRDBEntityTypeRefFolderAttributes, dbcore::kDBRefFolderAttribType> {
 protected:
  friend Concrete;
  using KRDBConcreteFolderAttributes::KRDBConcreteFolderAttributes;
};
