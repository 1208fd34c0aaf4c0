#pragma once

#include <memory>

#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbimage.hpp"

// The entity of one photo in the catalog, over a dbcore::DBImage record. Its values are cached from the
// record by its store hook; used on its context's thread.
class KRDBImage
    : public KRDBConcreteEntity<KRDBImage, KRDBEntity, KRDBEntityTypeImage, dbcore::kDBImageType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBImage(const std::shared_ptr<dbcore::DBImage>& image);
};
