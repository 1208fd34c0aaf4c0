#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "KRRecordPropertyChecks.hpp"
#include "KRRecordingEntityContext.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"

// A row of the setter check for a property whose record field is a plain member of the entity's record:
// the new value must reach the field as `expected`; setting the getter's answer again must post nothing.
template <class Entity, class Record, class Argument, class Result, class Value, class Field>
KRRecordProperty<Entity> recordFieldRow(const std::string& name, const std::string& changeKey,
                                        void (Entity::*setter)(Argument), Result (Entity::*getter)() const,
                                        Value newValue, Field Record::*field, Field expected) {
  return {name, changeKey, [setter, newValue](Entity& entity) { (entity.*setter)(newValue); },
          [field, expected](const Entity& entity) {
            const auto record = std::dynamic_pointer_cast<Record>(entity.dbentity());
            return record && (*record).*field == expected;
          },
          [setter, getter](Entity& entity) { (entity.*setter)((entity.*getter)()); }};
}

// The lazy image of an attribute entity: nil without a context; asked once of the context, which is told
// the entity, under the operation name `operation`; kept weakly; dropped by reset.
template <class Entity>
void expectLazyImage(const std::shared_ptr<Entity>& entity, const std::string& operation) {
  EXPECT_EQ(entity->image(), nullptr);
  const auto context = std::make_shared<KRRecordingEntityContext>();
  context->image = KRDBImage::initWithDBEntity(std::make_shared<dbcore::DBImage>());
  entity->setContext(context);
  EXPECT_EQ(entity->image(), context->image);
  EXPECT_EQ(entity->image(), context->image);
  EXPECT_EQ(context->calls, std::vector<std::string>{operation});
  EXPECT_EQ(context->askedFor, entity);
  EXPECT_EQ(entity->imagePrimitive(), context->image);
  entity->reset();
  EXPECT_EQ(entity->imagePrimitive(), nullptr);
  context->image.reset();
  EXPECT_EQ(entity->image(), nullptr);
  EXPECT_EQ(context->calls, (std::vector<std::string>{operation, operation}));
}

// The back reference is set without notification, held weakly, and a set one is answered without asking.
template <class Entity>
void expectWeakImagePrimitive(const std::shared_ptr<Entity>& entity) {
  const auto context = std::make_shared<KRRecordingEntityContext>();
  entity->setContext(context);
  const auto observer = KREntityObserverRecorder::observing(*entity);
  auto image = KRDBImage::initWithDBEntity(std::make_shared<dbcore::DBImage>());
  entity->setImagePrimitive(image);
  EXPECT_EQ(entity->image(), image);
  EXPECT_TRUE(context->calls.empty());
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(entity->isDbEntityChanged());
  EXPECT_EQ(entity->valueForKey("imagePrimitive").object(), image);
  image.reset();
  EXPECT_EQ(entity->imagePrimitive(), nullptr);
}
