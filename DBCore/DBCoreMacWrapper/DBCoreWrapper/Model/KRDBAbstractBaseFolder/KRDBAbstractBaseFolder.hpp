#pragma once

#include "Model/KRDBEntity/KRDBEntity.hpp"

// The abstract base of the folder-like entities (collections, smart filters, referenced folders),
// which live in trees. Has no type numbers of its own.
class KRDBAbstractBaseFolder : public KRDBEntity {
 protected:
  using KRDBEntity::KRDBEntity;
};
