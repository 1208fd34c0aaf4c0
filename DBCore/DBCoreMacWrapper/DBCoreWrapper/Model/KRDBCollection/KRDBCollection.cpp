#include "Model/KRDBCollection/KRDBCollection.hpp"

#include "Support/KRDBRecordConversions.hpp"

bool KRDBCollection::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBCollection::storeInfoFromDBFilter);
}

bool KRDBCollection::storeInfoFromDBFilter(const std::shared_ptr<dbcore::DBFilter>& filter) {
  name_ = KRDBRecordConversions::string(filter->name);
  order_ = filter->order;
  return true;
}

std::shared_ptr<dbcore::DBFilter> KRDBCollection::dbfilter() const {
  return std::dynamic_pointer_cast<dbcore::DBFilter>(dbentity());
}

void KRDBCollection::setName(const KRString& name) {
  setRecordValue(name_, name, kKRDBBaseFolderDidChangeName, [this](const KRString& value) {
    if (const auto record = dbfilter()) record->name = KRDBRecordConversions::wideString(value);
  });
}

void KRDBCollection::setOrder(double order) {
  setRecordValue(order_, order, kKRDBBaseFolderDidChangeOrder, [this](double value) {
    if (const auto record = dbfilter()) record->order = static_cast<float>(value);
  });
}

void KRDBCollection::addImages(const KRDBEntitySet& images) {
  if (const auto owner = context()) owner->addImages(images, selfFolder());
}

void KRDBCollection::removeImages(const KRDBEntitySet& images) {
  if (const auto owner = context()) owner->deleteImages(images, selfFolder());
}
