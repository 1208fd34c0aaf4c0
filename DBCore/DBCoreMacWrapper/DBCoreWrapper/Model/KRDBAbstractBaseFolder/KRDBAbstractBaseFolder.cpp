#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"

#include <utility>

const char* const kKRDBBaseFolderDidChangeName = "kKRDBBaseFolderDidChangeName";
const char* const kKRDBBaseFolderDidChangeOrder = "kKRDBBaseFolderDidChangeOrder";

namespace {

const char* const kAttributesPrimitive = "attributesPrimitive";

using EntitySetPtr = KRDBAbstractBaseFolder::EntitySetPtr;

// The members of `given` that are (or are not, with `present` false) members of `current`.
KRDBEntitySet membersOf(const EntitySetPtr& current, const KRDBEntitySet& given, bool present) {
  KRDBEntitySet result;
  for (const auto& entity : given) {
    if ((current && current->count(entity) != 0) == present) result.insert(entity);
  }
  return result;
}

// Adds the given entities that are not members to the cached set through `store`; answers them.
template <class Store>
KRDBEntitySet addMembers(const EntitySetPtr& current, const KRDBEntitySet& given, Store&& store) {
  KRDBEntitySet added = membersOf(current, given, false);
  if (added.empty()) return added;
  auto merged = current ? std::make_shared<KRDBEntitySet>(*current) : std::make_shared<KRDBEntitySet>();
  merged->insert(added.begin(), added.end());
  store(std::move(merged));
  return added;
}

// Removes the given entities that are members from the cached set through `store`; answers them.
template <class Store>
KRDBEntitySet deleteMembers(const EntitySetPtr& current, const KRDBEntitySet& given, Store&& store) {
  KRDBEntitySet removed = membersOf(current, given, true);
  if (removed.empty()) return removed;
  auto remaining = std::make_shared<KRDBEntitySet>(*current);
  for (const auto& entity : removed) remaining->erase(entity);
  store(std::move(remaining));
  return removed;
}

// A set of entities as a key-value value.
KRValue entitySetValue(const EntitySetPtr& entities) {
  if (!entities) return {};
  std::vector<KRValue> members;
  members.reserve(entities->size());
  for (const auto& entity : *entities) members.emplace_back(entity);
  return KRSet(members);
}

}  // namespace

const std::vector<std::string>& KRDBAbstractBaseFolder::necessaryLinkedEntitiesKeys() {
  static const std::vector<std::string> keys{kAttributesPrimitive};
  return keys;
}

// ---- Tree and members

std::shared_ptr<KRDBAbstractBaseFolder> KRDBAbstractBaseFolder::parent() {
  auto cached = parent_.lock();
  if (cached) return cached;
  const auto owner = context();
  if (!owner) return nullptr;
  cached = owner->parentOfFilter(selfFolder());
  parent_ = cached;
  return cached;
}

void KRDBAbstractBaseFolder::setParent(const std::shared_ptr<KRDBAbstractBaseFolder>& parent) {
  if (parent_.lock() == parent) return;
  setParentPrimitive(parent);
  didChangeWithoutRecord();
}

KRDBAbstractBaseFolder::EntitySetPtr KRDBAbstractBaseFolder::images() {
  if (images_) return images_;
  const auto owner = context();
  if (owner) images_ = std::make_shared<const KRDBEntitySet>(owner->imagesOfFilter(selfFolder()));
  return images_;
}

KRDBAbstractBaseFolder::EntitySetPtr KRDBAbstractBaseFolder::childs() {
  if (childs_) return childs_;
  const auto owner = context();
  if (owner) childs_ = std::make_shared<const KRDBEntitySet>(owner->childsOfFilter(selfFolder()));
  return childs_;
}

void KRDBAbstractBaseFolder::setImagesPrimitive(EntitySetPtr images) {
  if (images == images_) return;
  images_ = std::move(images);
  didChangeWithoutRecord();
}

void KRDBAbstractBaseFolder::setSubfiltersPrimitive(EntitySetPtr childs, bool notify) {
  if (childs == childs_) return;
  childs_ = std::move(childs);
  if (notify) didChangeWithoutRecord();
}

void KRDBAbstractBaseFolder::setSubfiltersPrimitive(EntitySetPtr childs) {
  setSubfiltersPrimitive(std::move(childs), true);
}

KRDBEntitySet KRDBAbstractBaseFolder::addImagesPrimitive(const KRDBEntitySet& images) {
  return addMembers(images_, images, [this](EntitySetPtr merged) { setImagesPrimitive(std::move(merged)); });
}

KRDBEntitySet KRDBAbstractBaseFolder::addChildsPrimitive(const KRDBEntitySet& childs) {
  return addMembers(childs_, childs,
                    [this](EntitySetPtr merged) { setSubfiltersPrimitive(std::move(merged)); });
}

KRDBEntitySet KRDBAbstractBaseFolder::deleteImagesPrimitive(const KRDBEntitySet& images) {
  return deleteMembers(images_, images,
                       [this](EntitySetPtr remaining) { setImagesPrimitive(std::move(remaining)); });
}

KRDBEntitySet KRDBAbstractBaseFolder::deleteChildsPrimitive(const KRDBEntitySet& childs) {
  return deleteMembers(childs_, childs,
                       [this](EntitySetPtr remaining) { setSubfiltersPrimitive(std::move(remaining)); });
}

// ---- Membership changes

void KRDBAbstractBaseFolder::addChild(const std::shared_ptr<KRDBAbstractBaseFolder>& child) {
  addChilds(KRDBEntitySet{child});
}

void KRDBAbstractBaseFolder::addChilds(const KRDBEntitySet& childs) {
  if (const auto owner = context()) owner->addChilds(childs, selfFolder());
}

void KRDBAbstractBaseFolder::addImages(const KRDBEntitySet& /*images*/) {}

void KRDBAbstractBaseFolder::removeImages(const KRDBEntitySet& /*images*/) {}

// ---- Key-value coding

KRValue KRDBAbstractBaseFolder::valueForKey(const std::string& key) const {
  if (key == "parent" || key == "parentPrimitive") return parentPrimitive();
  if (key == "images" || key == "imagesPrimitive") return entitySetValue(images_);
  if (key == "childs" || key == "childsPrimitive") return entitySetValue(childs_);
  if (key == "name") return name_;
  if (key == "order") return order();
  if (key == "attributes" || key == kAttributesPrimitive) return attributes_;
  return KRDBEntity::valueForKey(key);
}

void KRDBAbstractBaseFolder::setValueForKey(const KRValue& value, const std::string& key) {
  if (key == "parent") return setParent(value.objectAs<KRDBAbstractBaseFolder>());
  if (key == "parentPrimitive") return setParentPrimitive(value.objectAs<KRDBAbstractBaseFolder>());
  if (key == "name") return setName(value.string());
  if (key == "order") return setOrder(value.number().doubleValue());
  if (key == kAttributesPrimitive) return setAttributesPrimitive(value.objectAs<KRDBBaseFolderAttributes>());
  KRDBEntity::setValueForKey(value, key);
}
