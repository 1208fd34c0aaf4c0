#pragma once

#include <memory>

#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbuserimgattrib.hpp"

// The user's marks of one image (rating, colour, flags), over a dbcore::DBUserImgAttrib record. Its values
// are cached from the record by its store hook; used on its context's thread.
class KRDBImageAttributes
    : public KRDBConcreteEntity<KRDBImageAttributes, KRDBEntity, KRDBEntityTypeImageAttributes,
                                dbcore::kDBUserImgAttribType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBAttrib(const std::shared_ptr<dbcore::DBUserImgAttrib>& attributes);
};
