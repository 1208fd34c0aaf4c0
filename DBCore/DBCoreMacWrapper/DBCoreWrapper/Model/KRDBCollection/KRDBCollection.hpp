#pragma once

#include <memory>

#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbfilter.hpp"

// A user-made collection of images, over a dbcore::DBFilter record that stores its name and its order (as a
// 32-bit float). Images join and leave it through the context. Used on its context's thread.
class KRDBCollection : public KRDBConcreteEntity<KRDBCollection, KRDBAbstractBaseFolder,
                                                 KRDBEntityTypeCollection, dbcore::kDBFilterType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;
  std::shared_ptr<dbcore::DBFilter> dbfilter() const;

  // Setter protocol: compared by value; the record gets the name as a wide string (empty for nil).
  void setName(const KRString& name) override;
  // Setter protocol: compared by value; the record gets a 32-bit float, this object keeps the full value.
  void setOrder(double order) override;
  // The context's addImages:toFilter: and deleteImages:fromFilter: with this collection.
  void addImages(const KRDBEntitySet& images) override;
  void removeImages(const KRDBEntitySet& images) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBFilter(const std::shared_ptr<dbcore::DBFilter>& filter);
};
