#include "Model/KRDBBaseFolderAttributes/KRDBBaseFolderAttributes.hpp"

#include <vector>

#include "Support/KRDBRecordConversions.hpp"
#include "dbconstants.hpp"

const char* const kKRDBBaseFolderAttributesDidChangeFavorite = "kKRDBBaseFolderAttributesDidChangeFavorite";
const char* const kKRDBBaseFolderAttributesDidChangeSelectedFilterTypes =
    "kKRDBBaseFolderAttributesDidChangeSelectedFilterTypes";

std::wstring KRDBBaseFolderAttributes::selectedFilterTypesWString() const {
  std::wstring joined;
  bool first = true;
  for (const KRValue& type : selectedFilterTypes_.allObjects()) {
    if (!first) joined += dbcore::kUserConditionsDelimiter;
    joined += KRDBRecordConversions::wideString(type.string());
    first = false;
  }
  return joined;
}

void KRDBBaseFolderAttributes::setSelectedFilterTypesWithWString(const std::wstring& selectedFilterTypes) {
  const std::wstring& delimiter = dbcore::kUserConditionsDelimiter;
  std::vector<KRValue> pieces;
  size_t start = 0;
  for (size_t found = selectedFilterTypes.find(delimiter); found != std::wstring::npos;
       found = selectedFilterTypes.find(delimiter, start)) {
    pieces.emplace_back(KRDBRecordConversions::string(selectedFilterTypes.substr(start, found - start)));
    start = found + delimiter.size();
  }
  pieces.emplace_back(KRDBRecordConversions::string(selectedFilterTypes.substr(start)));
  selectedFilterTypes_ = KRSet(pieces);
}

KRValue KRDBBaseFolderAttributes::valueForKey(const std::string& key) const {
  if (key == "favorite" || key == "isFavorite") return isFavorite();
  if (key == "selectedFilterTypes") return selectedFilterTypes_;
  return KRDBEntity::valueForKey(key);
}

void KRDBBaseFolderAttributes::setValueForKey(const KRValue& value, const std::string& key) {
  if (key == "favorite") return setFavorite(value.number().boolValue());
  if (key == "selectedFilterTypes") return setSelectedFilterTypes(value.set());
  KRDBEntity::setValueForKey(value, key);
}
