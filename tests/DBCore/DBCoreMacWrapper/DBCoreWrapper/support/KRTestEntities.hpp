#pragma once

#include <cstdint>
#include <memory>

#include "Model/KRDBEntity/KRDBEntityClasses.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "dbimage.hpp"
#include "dbpath.hpp"

// Bare entities over fresh records with a given id, for tests that need entities but no catalog. The
// entity classes are registered first, so that a test passes when it runs alone.
namespace KRTestEntities {

inline std::shared_ptr<KRDBImage> makeImage(int64_t id) {
  KRDBEntityClasses::registerAll();
  auto record = std::make_shared<dbcore::DBImage>();
  record->set_id(id);
  return KRDBImage::initWithDBEntity(record);
}

inline std::shared_ptr<KRDBPath> makePath(int64_t id) {
  KRDBEntityClasses::registerAll();
  auto record = std::make_shared<dbcore::DBPath>();
  record->set_id(id);
  return KRDBPath::initWithDBEntity(record);
}

}  // namespace KRTestEntities
