#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"

const char* const kKRDBEntityFavoriteAliasDidChangeFavorite = "kKRDBEntityFavoriteAliasDidChangeFavorite";
const char* const kKRDBEntityFavoriteAliasDidChangeFavoriteOrder =
    "kKRDBEntityFavoriteAliasDidChangeFavoriteOrder";

namespace {

const char* const kOriginalEntityPrimitive = "originalEntityPrimitive";
const char* const kFavoriteAliasPrimitive = "favoriteAliasPrimitive";

}  // namespace

const std::vector<std::string>& KRDBEntityFavoriteAlias::necessaryLinkedEntitiesKeys() {
  static const std::vector<std::string> keys{kOriginalEntityPrimitive};
  return keys;
}

std::string KRDBEntityFavoriteAlias::reverseKeyForNecessaryKey(const std::string& key) {
  return key == kOriginalEntityPrimitive ? kFavoriteAliasPrimitive : std::string();
}

bool KRDBEntityFavoriteAlias::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBEntityFavoriteAlias::storeInfoFromDBAlias);
}

bool KRDBEntityFavoriteAlias::storeInfoFromDBAlias(
    const std::shared_ptr<dbcore::DBEntityFavoriteAlias>& alias) {
  favorite_ = alias->favorite;
  favoriteOrder_ = alias->favorite_order;
  originalEntityID_ =
      KRDBEntityID::initWithEntityType(entityTypeForDBEntityType(alias->orig_entity_type()), alias->orig_id);
  return true;
}

std::shared_ptr<dbcore::DBEntityFavoriteAlias> KRDBEntityFavoriteAlias::dbalias() const {
  return std::dynamic_pointer_cast<dbcore::DBEntityFavoriteAlias>(dbentity());
}

void KRDBEntityFavoriteAlias::setFavorite(bool favorite) {
  setRecordValue(favorite_, favorite, kKRDBEntityFavoriteAliasDidChangeFavorite, [this](bool value) {
    if (const auto record = dbalias()) record->favorite = value;
  });
}

void KRDBEntityFavoriteAlias::setFavoriteOrder(double favoriteOrder) {
  setRecordValue(favoriteOrder_, favoriteOrder, kKRDBEntityFavoriteAliasDidChangeFavoriteOrder,
                 [this](double value) {
                   if (const auto record = dbalias()) record->favorite_order = static_cast<float>(value);
                 });
}

void KRDBEntityFavoriteAlias::updateNecessaryEntityForKey(const std::string& key,
                                                          const std::shared_ptr<KRDBEntity>& entity) {
  KRDBEntity::updateNecessaryEntityForKey(key, entity);
  const std::string reverseKey = reverseKeyForNecessaryKey(key);
  if (!reverseKey.empty() && entity) entity->setValueForKey(KRValue(self()), reverseKey);
}

void KRDBEntityFavoriteAlias::reset() {
  originalEntity_.reset();
  KRDBEntity::reset();
}

void KRDBEntityFavoriteAlias::resetToDefaultState() {
  KRDBEntity::resetToDefaultState();
  setFavorite(false);
}

KRValue KRDBEntityFavoriteAlias::valueForKey(const std::string& key) const {
  if (key == "favorite") return favorite_;
  if (key == "favoriteOrder") return favoriteOrder_;
  if (key == "originalEntityID") return originalEntityID_;
  if (key == "originalEntity" || key == kOriginalEntityPrimitive) return originalEntityPrimitive();
  return KRDBEntity::valueForKey(key);
}

void KRDBEntityFavoriteAlias::setValueForKey(const KRValue& value, const std::string& key) {
  if (key == "favorite") return setFavorite(value.number().boolValue());
  if (key == "favoriteOrder") return setFavoriteOrder(value.number().doubleValue());
  if (key == kOriginalEntityPrimitive) return setOriginalEntityPrimitive(value.objectAs<KRDBEntity>());
  KRDBEntity::setValueForKey(value, key);
}
