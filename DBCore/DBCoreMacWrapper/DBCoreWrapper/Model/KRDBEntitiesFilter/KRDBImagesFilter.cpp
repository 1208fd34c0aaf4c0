#include "Model/KRDBEntitiesFilter/KRDBImagesFilter.hpp"

#include <utility>

#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"

namespace {

// The image an attribute record belongs to, or nil for another entity.
std::shared_ptr<KRDBImage> imageOfAttributes(const std::shared_ptr<KRDBEntity>& entity) {
  switch (entity->entityID()->entityType()) {
    case KRDBEntityTypeImageAttributes:
      return std::static_pointer_cast<KRDBImageAttributes>(entity)->imagePrimitive();
    case KRDBEntityTypeImageExivAttributes:
      return std::static_pointer_cast<KRDBImageExivAttributes>(entity)->imagePrimitive();
    default:
      return nullptr;
  }
}

}  // namespace

std::shared_ptr<KRDBImagesFilter> KRDBImagesFilter::initWithContext(
    const std::shared_ptr<KRDBContext>& context, RequestPtr request) {
  std::shared_ptr<KRDBImagesFilter> filter(new KRDBImagesFilter());
  filter->setUpWithContext(context, std::move(request));
  return filter;
}

void KRDBImagesFilter::processChanges(const ChangesStoragePtr& changes) {
  if (!changes || !changes->updatedEntities()) return KRDBRequestedEntitiesFilter::processChanges(changes);
  auto updated = std::make_shared<KRDBEntitySet>(*changes->updatedEntities());
  auto records = emptyEntitiesChangesMapTable();
  if (changes->entitiesChanges()) {
    changes->entitiesChanges()->forEach(
        [&records](const KRDBEntityIDPtr& entityID, const std::shared_ptr<KRObject>& record) {
          records->setObject(record, entityID);
        });
  }
  for (const auto& entity : *changes->updatedEntities()) {
    const auto image = imageOfAttributes(entity);
    if (!image) continue;
    updated->insert(image);
    if (changes->entitiesChanges()) {
      if (const auto record = changes->entitiesChanges()->objectForKey(entity->entityID()))
        records->setObject(record, image->entityID());
    }
  }
  KRDBRequestedEntitiesFilter::processChanges(KRDBEntitiesChangesStorage::initWithAddedEntities(
      changes->addedEntities(), changes->deletedEntities(), std::move(updated), std::move(records)));
}
