#pragma once

#include "Model/KRDBEntity/KRDBEntity.hpp"

// The abstract base of the attribute records of the folder-like entities. Has no type numbers of its own.
class KRDBBaseFolderAttributes : public KRDBEntity {
 protected:
  using KRDBEntity::KRDBEntity;
};
