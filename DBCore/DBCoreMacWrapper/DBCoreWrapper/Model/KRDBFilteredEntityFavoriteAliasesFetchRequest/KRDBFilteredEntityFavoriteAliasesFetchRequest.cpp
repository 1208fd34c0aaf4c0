#include "Model/KRDBFilteredEntityFavoriteAliasesFetchRequest/KRDBFilteredEntityFavoriteAliasesFetchRequest.hpp"

#include "KRFoundation/KRValue.hpp"

void KRDBFilteredEntityFavoriteAliasesFetchRequest::setCondition(const KRString& condition) {
  if (identical(condition_, condition)) return;
  condition_ = condition;
  reset();
}

KRDBFilteredEntitiesFetchRequest::SelectQueryPtr
KRDBFilteredEntityFavoriteAliasesFetchRequest::makeSelectQuery() {
  return notMarkedToDeleteQuery<dbcore::DBEntityFavoriteAliasSelectQuery, dbcore::DBEntityFavoriteAlias>(
      condition_.str());
}

KRValue KRDBFilteredEntityFavoriteAliasesFetchRequest::valueForKey(const std::string& key) const {
  if (key == "condition") return condition_;
  return KRDBFilteredEntitiesFetchRequest::valueForKey(key);
}

void KRDBFilteredEntityFavoriteAliasesFetchRequest::setValueForKey(const KRValue& value,
                                                                   const std::string& key) {
  if (key == "condition") return setCondition(value.string());
  KRDBFilteredEntitiesFetchRequest::setValueForKey(value, key);
}
