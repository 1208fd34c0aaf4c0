#include "Model/KRDBEntity/KRDBDataStorageFactoryBase.hpp"

bool KRManyTypeEntityIDsIsEqualFunction(const KRDBEntityIDPtr& a, const KRDBEntityIDPtr& b) {
  return a->entityType() == b->entityType() && a->dbid() == b->dbid();
}

bool KROneTypeEntityIDsIsEqualFunction(const KRDBEntityIDPtr& a, const KRDBEntityIDPtr& b) {
  return a->dbid() == b->dbid();
}

uint64_t KROneTypeEntityIDsHashFunction(const KRDBEntityIDPtr& entityID) {
  return static_cast<uint64_t>(entityID->dbid());
}

namespace {

uint64_t entityIDHash(const KRDBEntityIDPtr& entityID) { return entityID->hash(); }

}  // namespace

std::shared_ptr<KRDBEntityIDMapTable> KRDBDataStorageFactoryBase::mapTableWithObjectsMappedByEntityIDs() {
  return std::make_shared<KRDBEntityIDMapTable>(&entityIDHash, &KRManyTypeEntityIDsIsEqualFunction, 0);
}

std::shared_ptr<KRDBEntityIDMapTable>
KRDBDataStorageFactoryBase::mapTableWithObjectsMappedBySameTypeEntityIDs() {
  return std::make_shared<KRDBEntityIDMapTable>(&KROneTypeEntityIDsHashFunction,
                                                &KROneTypeEntityIDsIsEqualFunction, 0);
}

std::shared_ptr<KRDBEntityIDMapTable> KRDBDataStorageFactoryBase::makeMapTableWithObjectsMappedByEntityIDs()
    const {
  return mapTableWithObjectsMappedByEntityIDs();
}

std::shared_ptr<KRDBEntityIDMapTable>
KRDBDataStorageFactoryBase::makeMapTableWithObjectsMappedBySameTypeEntityIDs() const {
  return mapTableWithObjectsMappedBySameTypeEntityIDs();
}
