#pragma once

#include <memory>

#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbexivimgattrib.hpp"

// The camera (exif) data of one image, over a dbcore::DBExivImgAttrib record. Its values are cached from the
// record by its store hook; used on its context's thread.
class KRDBImageExivAttributes
    : public KRDBConcreteEntity<KRDBImageExivAttributes, KRDBEntity, KRDBEntityTypeImageExivAttributes,
                                dbcore::kDBExivImgAttribType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBExivAttributes(const std::shared_ptr<dbcore::DBExivImgAttrib>& attributes);
};
