#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"

#include "Support/KRDBRecordConversions.hpp"
#include "Support/KRDictionaryJSON.hpp"

KRDictionary KRDBSmartFilter::conditionsDictionaryFromJsonWString(const std::wstring& json) {
  return KRDictionaryJSON::dictionaryWithJsonWString(json);
}

bool KRDBSmartFilter::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBSmartFilter::storeInfoFromDBSmartFilter);
}

bool KRDBSmartFilter::storeInfoFromDBSmartFilter(const std::shared_ptr<dbcore::DBSmartFilter>& smartFilter) {
  identifier_ = KRDBRecordConversions::string(smartFilter->identifier);
  filterConditions_ = conditionsDictionaryFromJsonWString(smartFilter->filter_conditions);
  applyingConditions_ = conditionsDictionaryFromJsonWString(smartFilter->applying_conditions);
  name_ = KRDBRecordConversions::string(smartFilter->name);
  return true;
}

std::shared_ptr<dbcore::DBSmartFilter> KRDBSmartFilter::dbsmartfilter() const {
  return std::dynamic_pointer_cast<dbcore::DBSmartFilter>(dbentity());
}

KRValue KRDBSmartFilter::valueForKey(const std::string& key) const {
  if (key == "filterConditions") return filterConditions_;
  if (key == "applyingConditions") return applyingConditions_;
  if (key == "identifier") return identifier_;
  return KRDBAbstractBaseFolder::valueForKey(key);
}
