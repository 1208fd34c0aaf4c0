#pragma once

#include <string>

#include "KRFoundation/KRString.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBRecordsFetchRequest.hpp"
#include "dbentityfavoritealias.hpp"
#include "dbentityfavoritealiasselectquery.hpp"

// The request for the favorite aliases not marked to delete that satisfy its condition (engine condition
// language over the alias columns, used as written: computed sub-expressions are not expanded here).
// Configure it on one thread; thread rule of KRDBFilteredEntitiesFetchRequest.
class KRDBFilteredEntityFavoriteAliasesFetchRequest final
    : public KRDBRecordsFetchRequest<KRDBFilteredEntityFavoriteAliasesFetchRequest,
                                     dbcore::DBEntityFavoriteAliasSelectQuery, dbcore::DBEntityFavoriteAlias,
                                     KRDBEntityTypeFavoriteAlias> {
 public:
  const KRString& condition() const { return condition_; }
  // Nothing for the same string object; otherwise stores it and resets the request.
  void setCondition(const KRString& condition);

  SelectQueryPtr makeSelectQuery() override;

  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;

 private:
  KRString condition_;
};
