#pragma once

#include <cstdint>
#include <memory>

#include "Model/KRDBEntity/KRDBEntity.hpp"

// The class side that every concrete entity class shares: its two type numbers, construction over an
// engine record, its registry entry. Derived names the class itself, Base its direct base.
template <class Derived, class Base, int64_t kEntityType, uint8_t kDBEntityType>
class KRDBConcreteEntity : public Base {
 public:
  static int64_t entityType() { return kEntityType; }
  static uint8_t dbEntityType() { return kDBEntityType; }

  // Nil without a record. A record of another class still gives an entity, whose store hook refused it.
  static std::shared_ptr<Derived> initWithDBEntity(const KRDBEntity::Record& record) {
    if (!record) return nullptr;
    std::shared_ptr<Derived> entity(new Derived(record));
    entity->storeInfoFromDBentity(record);
    return entity;
  }
  static const KRDBEntityClass& classInfo() {
    static const KRDBEntityClass info{kEntityType, kDBEntityType, &makeEntity,
                                      &Derived::necessaryLinkedEntitiesKeys};
    return info;
  }
  static void registerEntityClass() { KRDBEntity::registerEntityClass(classInfo()); }
  const KRDBEntityClass& entityClass() const override { return classInfo(); }

 protected:
  using Concrete = KRDBConcreteEntity;
  explicit KRDBConcreteEntity(KRDBEntity::Record record) : Base(std::move(record)) {}

 private:
  static std::shared_ptr<KRDBEntity> makeEntity(const KRDBEntity::Record& record) {
    return initWithDBEntity(record);
  }
};
