#pragma once

#include <memory>

#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbreffolder.hpp"

// A folder on disk whose images are in the catalog, over a dbcore::DBRefFolder record. Its values are cached
// from the record by its store hook; used on its context's thread.
class KRDBReferencedFolder
    : public KRDBConcreteEntity<KRDBReferencedFolder, KRDBAbstractBaseFolder, KRDBEntityTypeReferencedFolder,
                                dbcore::kDBRefFolderType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBReferencedFolder(const std::shared_ptr<dbcore::DBRefFolder>& folder);
};
