#pragma once

#include <cstdint>
#include <memory>
#include <utility>

#include "Model/KRDBEntity/KRDBEntity.hpp"
#include "Support/KRDBInPlaceAllocator.hpp"

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
    auto entity = std::allocate_shared<Derived>(KRDBInPlaceAllocator<Derived, Builder>(), record);
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
  // Builds entities in place for KRDBInPlaceAllocator (a catalog holds several per image); as a member of
  // the class each entity befriends, it reaches their constructors.
  struct Builder {
    template <class U, class... Args>
    static void build(U* place, Args&&... args) {
      ::new (static_cast<void*>(place)) U(std::forward<Args>(args)...);
    }
  };

  static std::shared_ptr<KRDBEntity> makeEntity(const KRDBEntity::Record& record) {
    return initWithDBEntity(record);
  }
};
