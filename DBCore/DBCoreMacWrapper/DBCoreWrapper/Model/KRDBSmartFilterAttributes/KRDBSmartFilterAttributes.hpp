#pragma once

#include "Model/KRDBBaseFolderAttributes/KRDBConcreteFolderAttributes.hpp"
#include "dbsmartfilterattrib.hpp"

// The attribute record of a smart filter, over a dbcore::DBSmartFilterAttrib record. The record stores the
// selected filter types only: the favorite flag lives in this object alone and is never stored. Used on its
// context's thread.
class KRDBSmartFilterAttributes
    : public KRDBConcreteFolderAttributes<KRDBSmartFilterAttributes, dbcore::DBSmartFilterAttrib,
                                          KRDBEntityTypeSmartFilterAttributes,
                                          dbcore::kDBSmartFilterAttribType> {
 protected:
  friend Concrete;
  using KRDBConcreteFolderAttributes::KRDBConcreteFolderAttributes;
};
