#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "KREntityObserverRecorder.hpp"

// One record-backed property of an entity class, as a row of a table-driven test.
template <class Entity>
struct KRRecordProperty {
  // The property's name, for failure messages.
  std::string name;
  // The change key the setter posts.
  std::string changeKey;
  // Sets a value different from the current one.
  std::function<void(Entity&)> setNewValue;
  // Whether the record now holds the new value with the property's conversion.
  std::function<bool(const Entity&)> recordHoldsNewValue;
  // Sets the value the property holds now (the same object, for properties compared by identity).
  std::function<void(Entity&)> setCurrentValue;
};

// The setter protocol of every row: a new value posts one willChange (no info) and one didChange with
// {key: true}, marks the entity changed and writes the record; the current value again posts nothing
// and leaves the entity unchanged.
template <class Entity>
void expectSetterProtocol(const std::function<std::shared_ptr<Entity>()>& makeEntity,
                          const std::vector<KRRecordProperty<Entity>>& properties) {
  for (const auto& property : properties) {
    SCOPED_TRACE(property.name);
    const auto entity = makeEntity();
    const auto observer = KREntityObserverRecorder::observing(*entity);
    property.setNewValue(*entity);
    ASSERT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
    EXPECT_TRUE(observer->events[0].info.isNil());
    EXPECT_EQ(observer->events[1].info, KRDictionary({{property.changeKey, true}}));
    EXPECT_TRUE(entity->isDbEntityChanged());
    EXPECT_TRUE(property.recordHoldsNewValue(*entity));
    observer->events.clear();
    entity->setDbEntityChanged(false);
    property.setCurrentValue(*entity);
    EXPECT_TRUE(observer->events.empty());
    EXPECT_FALSE(entity->isDbEntityChanged());
  }
}
