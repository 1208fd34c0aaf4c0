#pragma once

#include <memory>
#include <string>
#include <vector>

#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbentityfavoritealias.hpp"

extern const char* const kKRDBEntityFavoriteAliasDidChangeFavorite;
extern const char* const kKRDBEntityFavoriteAliasDidChangeFavoriteOrder;

// Marks another entity (an image, a folder) as a favorite and gives it a place in the favorites' order,
// over a dbcore::DBEntityFavoriteAlias record. Each entity has at most one alias, and the alias points
// back at its original entity. Used on its context's thread.
class KRDBEntityFavoriteAlias
    : public KRDBConcreteEntity<KRDBEntityFavoriteAlias, KRDBEntity, KRDBEntityTypeFavoriteAlias,
                                dbcore::kDBEntityFavoriteAliasType> {
 public:
  static const std::vector<std::string>& necessaryLinkedEntitiesKeys();
  // The key of the linked entity that points back at the alias for a necessary key, or empty.
  static std::string reverseKeyForNecessaryKey(const std::string& key);

  bool storeInfoFromDBentity(const Record& record) override;
  std::shared_ptr<dbcore::DBEntityFavoriteAlias> dbalias() const;

  bool isFavorite() const { return favorite_; }
  void setFavorite(bool favorite);
  double favoriteOrder() const { return favoriteOrder_; }
  // The record keeps a 32-bit float; the alias keeps the full value until it is reloaded.
  void setFavoriteOrder(double favoriteOrder);
  const KRDBEntityIDPtr& originalEntityID() const { return originalEntityID_; }

  // The back reference, without notification. Held weakly: the original entity holds its alias.
  std::shared_ptr<KRDBEntity> originalEntity() const { return originalEntity_.lock(); }
  std::shared_ptr<KRDBEntity> originalEntityPrimitive() const { return originalEntity_.lock(); }
  void setOriginalEntityPrimitive(const std::shared_ptr<KRDBEntity>& entity) { originalEntity_ = entity; }

  // The base's, then the linked entity's reverse key is pointed at this alias.
  void updateNecessaryEntityForKey(const std::string& key,
                                   const std::shared_ptr<KRDBEntity>& entity) override;
  void reset() override;
  // The base's, then no longer a favorite (the order is kept).
  void resetToDefaultState() override;

  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  bool storeInfoFromDBAlias(const std::shared_ptr<dbcore::DBEntityFavoriteAlias>& alias);

 private:
  bool favorite_ = false;
  double favoriteOrder_ = 0;
  KRDBEntityIDPtr originalEntityID_;
  std::weak_ptr<KRDBEntity> originalEntity_;
};
