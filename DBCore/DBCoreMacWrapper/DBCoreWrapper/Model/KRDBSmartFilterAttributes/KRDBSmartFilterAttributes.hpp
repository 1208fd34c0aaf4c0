#pragma once

#include <memory>

#include "KRFoundation/KRValue.hpp"
#include "Model/KRDBBaseFolderAttributes/KRDBBaseFolderAttributes.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbsmartfilterattrib.hpp"

// The attribute record of a smart filter, over a dbcore::DBSmartFilterAttrib record. The record stores the
// selected filter types only: the favorite flag lives in this object alone and is never stored. Used on its
// context's thread.
class KRDBSmartFilterAttributes
    : public KRDBConcreteEntity<KRDBSmartFilterAttributes, KRDBBaseFolderAttributes,
                                KRDBEntityTypeSmartFilterAttributes, dbcore::kDBSmartFilterAttribType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;
  std::shared_ptr<dbcore::DBSmartFilterAttrib> dbattrib() const;

  // Setter protocol: compared by identity (an equal but distinct set is a change), written joined.
  void setSelectedFilterTypes(const KRSet& selectedFilterTypes) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBAttrib(const std::shared_ptr<dbcore::DBSmartFilterAttrib>& attributes);
};
