#pragma once

#include <cstdint>
#include <memory>

#include "KRFoundation/KRValue.hpp"
#include "Model/KRDBBaseFolderAttributes/KRDBBaseFolderAttributes.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"

// What the three folder attribute classes share over their engine record TypedRecord: the typed store hook,
// the typed record, and the setter protocol for the fields the record stores (the favorite flag only where
// the record has one; otherwise the base's plain setter). Used on its context's thread.
template <class Derived, class TypedRecord, int64_t kEntityType, uint8_t kDBEntityType>
class KRDBConcreteFolderAttributes
    : public KRDBConcreteEntity<Derived, KRDBBaseFolderAttributes, kEntityType, kDBEntityType> {
 public:
  static constexpr bool kStoresFavorite = requires(TypedRecord record) { record.favorite; };

  bool storeInfoFromDBentity(const KRDBEntity::Record& record) override {
    return this->storeInfoWithHook(record, &KRDBConcreteFolderAttributes::storeInfoFromDBAttrib);
  }
  std::shared_ptr<TypedRecord> dbattrib() const {
    return std::dynamic_pointer_cast<TypedRecord>(this->dbentity());
  }

  // Setter protocol where the record stores the flag: compared by value, written to its favorite field.
  void setFavorite(bool favorite) override {
    if constexpr (kStoresFavorite) {
      this->template setRecordFavorite<TypedRecord>(favorite);
    } else {
      KRDBBaseFolderAttributes::setFavorite(favorite);
    }
  }
  // Setter protocol: compared by identity (an equal but distinct set is a change), written joined.
  void setSelectedFilterTypes(const KRSet& selectedFilterTypes) override {
    this->template setRecordSelectedFilterTypes<TypedRecord>(selectedFilterTypes);
  }

 protected:
  using KRDBConcreteEntity<Derived, KRDBBaseFolderAttributes, kEntityType, kDBEntityType>::KRDBConcreteEntity;
  // Takes the values of a record of this class.
  bool storeInfoFromDBAttrib(const std::shared_ptr<TypedRecord>& attributes) {
    return this->storeAttributesFromRecord(attributes);
  }
};
