#pragma once

#include <gtest/gtest.h>

#include <memory>

#include "Model/KRDBEntity/KRDBEntity.hpp"
#include "Model/KRDBEntity/KRDBEntityClasses.hpp"

// The checks that every concrete entity class shares: Entity is the class, OwnRecord the engine record
// class it wraps, OtherRecord a record class of another entity.
template <class Entity, class OwnRecord, class OtherRecord>
struct KREntityClassChecks {
  static std::shared_ptr<OwnRecord> ownRecord(int64_t id, bool markedToDelete = false) {
    auto record = std::make_shared<OwnRecord>();
    record->set_id(id);
    record->set_marked_to_delete(markedToDelete);
    return record;
  }

  // The registry maps the class's record type to its class entry and entity type.
  static void expectRegistered() {
    KRDBEntityClasses::registerAll();
    const KRDBEntityClass& info = Entity::classInfo();
    EXPECT_EQ(info.entityType, Entity::entityType());
    EXPECT_EQ(info.dbEntityType, Entity::dbEntityType());
    EXPECT_EQ(KRDBEntity::entityClassForDBEntityType(Entity::dbEntityType()), &info);
    EXPECT_EQ(KRDBEntity::entityTypeForDBEntityType(Entity::dbEntityType()), Entity::entityType());
  }

  // The registry builds an entity of the class over a record of its own, taking its identity.
  static void expectBuiltOverOwnRecord() {
    KRDBEntityClasses::registerAll();
    const auto record = ownRecord(7);
    const auto entity = std::dynamic_pointer_cast<Entity>(KRDBEntity::entityWithDBEntity(record));
    ASSERT_NE(entity, nullptr);
    EXPECT_EQ(entity->entityID()->entityType(), Entity::entityType());
    EXPECT_EQ(entity->entityID()->dbid(), 7);
    EXPECT_EQ(entity->dbentity(), record);
    EXPECT_EQ(&entity->entityClass(), &Entity::classInfo());
    EXPECT_FALSE(entity->isMarkedToDelete());
  }

  static void expectMarkedToDeleteTakenFromRecord() {
    KRDBEntityClasses::registerAll();
    const auto entity = KRDBEntity::entityWithDBEntity(ownRecord(8, true));
    ASSERT_NE(entity, nullptr);
    EXPECT_TRUE(entity->isMarkedToDelete());
  }

  // No record gives no entity; a record of another class gives an entity whose store hook refuses it.
  static void expectForeignRecordsRefused() {
    EXPECT_EQ(Entity::initWithDBEntity(nullptr), nullptr);
    const auto other = std::make_shared<OtherRecord>();
    other->set_id(9);
    const auto entity = Entity::initWithDBEntity(other);
    ASSERT_NE(entity, nullptr);
    EXPECT_FALSE(entity->storeInfoFromDBentity(other));
    EXPECT_FALSE(entity->storeInfoFromDBentity(nullptr));
    EXPECT_TRUE(entity->storeInfoFromDBentity(ownRecord(9)));
  }
};
