#pragma once

#include <memory>

#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbimghistorystate.hpp"

// One edit-history state of an image, over a dbcore::DBImgHistoryState record. Its values are cached from the
// record by its store hook; used on its context's thread.
class KRDBImageState : public KRDBConcreteEntity<KRDBImageState, KRDBEntity, KRDBEntityTypeImageState,
                                                 dbcore::kDBImgHistoryStateType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBState(const std::shared_ptr<dbcore::DBImgHistoryState>& state);
};
