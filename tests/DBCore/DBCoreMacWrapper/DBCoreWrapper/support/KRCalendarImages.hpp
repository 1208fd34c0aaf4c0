#pragma once

#include <cstdint>
#include <memory>

#include "KRTestEntities.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "dbexivimgattrib.hpp"
#include "dbuserimgattrib.hpp"

// Bare images with the attributes a calendar reads: a capture date, and the trashed and lost marks.
namespace KRCalendarImages {

// An image of the id whose exif attributes say it was taken `seconds` after 1970.
inline std::shared_ptr<KRDBImage> imageTakenAt(int64_t id, int64_t seconds) {
  const auto image = KRTestEntities::makeImage(id);
  auto exif = std::make_shared<dbcore::DBExivImgAttrib>();
  exif->set_id(id);
  exif->date = seconds;
  image->setExivAttributesPrimitive(KRDBImageExivAttributes::initWithDBEntity(exif));
  return image;
}

// Gives the image user attributes with the marks.
inline void markImage(const std::shared_ptr<KRDBImage>& image, bool trashed, bool lost) {
  auto record = std::make_shared<dbcore::DBUserImgAttrib>();
  record->set_id(image->entityID()->dbid());
  record->trashed = trashed;
  record->lost = lost;
  image->setAttributesPrimitive(KRDBImageAttributes::initWithDBEntity(record));
}

}  // namespace KRCalendarImages
