#include "Model/KRDBEntity/KRDBEntityID.hpp"

#include <array>

#include "KRClasses/KRComposedHashValues.hpp"
#include "KRFoundation/KRValue.hpp"

namespace {

uint64_t hashOf(int64_t entityType, int64_t dbid) {
  const std::array<uint64_t, 2> values{static_cast<uint64_t>(entityType), static_cast<uint64_t>(dbid)};
  return composedHashValues(values.data(), values.size());
}

}  // namespace

KRDBEntityID::KRDBEntityID(int64_t entityType, int64_t databaseID)
    : hash_(hashOf(entityType, databaseID)), entityType_(entityType), dbid_(databaseID) {}

std::shared_ptr<KRDBEntityID> KRDBEntityID::initWithEntityType(int64_t entityType, int64_t databaseID) {
  return std::allocate_shared<KRDBEntityID>(KRDBInPlaceAllocator<KRDBEntityID, Builder>(), entityType,
                                            databaseID);
}

bool KRDBEntityID::isEqual(const std::shared_ptr<const KRObject>& other) const {
  return isEqualTo(std::dynamic_pointer_cast<const KRDBEntityID>(other));
}

bool KRDBEntityID::isEqualTo(const std::shared_ptr<const KRDBEntityID>& other) const {
  return other && other->entityType_ == entityType_ && other->dbid_ == dbid_;
}

std::shared_ptr<KRDBEntityID> KRDBEntityID::copyWithZone() const {
  return initWithEntityType(entityType_, dbid_);
}

std::string KRDBEntityID::description() const {
  return "<" + defaultDescription() + ": " + std::to_string(entityType_) + "_" + std::to_string(dbid_) + ">";
}

KRValue KRDBEntityID::valueForKey(const std::string& key) const {
  if (key == "dbid") return dbid_;
  if (key == "entityType") return entityType_;
  return KRObject::valueForKey(key);
}
