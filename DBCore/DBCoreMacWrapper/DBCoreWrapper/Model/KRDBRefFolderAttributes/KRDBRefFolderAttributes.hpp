#pragma once

#include <memory>

#include "KRFoundation/KRValue.hpp"
#include "Model/KRDBBaseFolderAttributes/KRDBBaseFolderAttributes.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbreffolderattrib.hpp"

// The attribute record of a referenced folder, over a dbcore::DBRefFolderAttrib record: favorite flag and
// selected filter types, both stored. Used on its context's thread.
class KRDBRefFolderAttributes
    : public KRDBConcreteEntity<KRDBRefFolderAttributes, KRDBBaseFolderAttributes,
                                KRDBEntityTypeRefFolderAttributes, dbcore::kDBRefFolderAttribType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;
  std::shared_ptr<dbcore::DBRefFolderAttrib> dbattrib() const;

  // Setter protocol: compared by value, written to the record's favorite field.
  void setFavorite(bool favorite) override;
  // Setter protocol: compared by identity (an equal but distinct set is a change), written joined.
  void setSelectedFilterTypes(const KRSet& selectedFilterTypes) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBAttrib(const std::shared_ptr<dbcore::DBRefFolderAttrib>& attributes);
};
