#pragma once

#include <memory>

#include "KRFoundation/KRValue.hpp"
#include "Model/KRDBBaseFolderAttributes/KRDBBaseFolderAttributes.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbfilterattrib.hpp"

// The attribute record of a collection, over a dbcore::DBFilterAttrib record: favorite flag and selected
// filter types, both stored. Used on its context's thread.
class KRDBCollectionAttributes
    : public KRDBConcreteEntity<KRDBCollectionAttributes, KRDBBaseFolderAttributes,
                                KRDBEntityTypeCollectionAttributes, dbcore::kDBFilterAttribType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;
  std::shared_ptr<dbcore::DBFilterAttrib> dbattrib() const;

  // Setter protocol: compared by value, written to the record's favorite field.
  void setFavorite(bool favorite) override;
  // Setter protocol: compared by identity (an equal but distinct set is a change), written joined.
  void setSelectedFilterTypes(const KRSet& selectedFilterTypes) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBAttrib(const std::shared_ptr<dbcore::DBFilterAttrib>& attributes);
};
