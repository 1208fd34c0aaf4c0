#pragma once

#include <cstdint>

// The layer's numbering of entity kinds, carried by every KRDBEntityID. The engine numbers its records
// differently (dbcore::DBEntityType); only the entity class registry translates between the two. Both are
// fixed numbers that catalog files and applications rely on.
enum KRDBEntityType : int64_t {
  KRDBEntityTypeNone = 0,
  KRDBEntityTypeImage = 1,
  KRDBEntityTypeCollection = 2,
  KRDBEntityTypeReferencedFolder = 3,
  KRDBEntityTypePath = 4,
  KRDBEntityTypeImageAttributes = 5,
  KRDBEntityTypeImageExivAttributes = 6,
  KRDBEntityTypeRefFolderAttributes = 7,
  KRDBEntityTypeCollectionAttributes = 8,
  KRDBEntityTypeFavoriteAlias = 9,
  KRDBEntityTypeImageState = 10,
  KRDBEntityTypeSmartFilter = 11,
  KRDBEntityTypeSmartFilterAttributes = 12,
  KRDBEntityTypeVolume = 13,
};
