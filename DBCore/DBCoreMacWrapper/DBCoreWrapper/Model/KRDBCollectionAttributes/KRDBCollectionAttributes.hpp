#pragma once

#include "Model/KRDBBaseFolderAttributes/KRDBConcreteFolderAttributes.hpp"
#include "dbfilterattrib.hpp"

// The attribute record of a collection, over a dbcore::DBFilterAttrib record: favorite flag and selected
// filter types, both stored. Used on its context's thread.
class KRDBCollectionAttributes
    : public KRDBConcreteFolderAttributes<KRDBCollectionAttributes, dbcore::DBFilterAttrib,
                                          KRDBEntityTypeCollectionAttributes, dbcore::kDBFilterAttribType> {
 protected:
  friend Concrete;
  using KRDBConcreteFolderAttributes::KRDBConcreteFolderAttributes;
};
