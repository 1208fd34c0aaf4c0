#pragma once

#include <memory>
#include <string>

#include "KRFoundation/KRValue.hpp"
#include "Model/KRDBEntity/KRDBEntity.hpp"

// Change keys of the folder attribute records.
extern const char* const kKRDBBaseFolderAttributesDidChangeFavorite;
extern const char* const kKRDBBaseFolderAttributesDidChangeSelectedFilterTypes;

// The abstract base of the attribute records of the folder-like entities: whether the folder is a favorite
// and which quick filter types (strings) its view selects. The plain accessors here neither notify nor write
// the record; the concrete classes replace the setters their record can store. Has no type numbers of its
// own. Used on its context's thread.
class KRDBBaseFolderAttributes : public KRDBEntity {
 public:
  virtual bool isFavorite() const { return favorite_; }
  virtual void setFavorite(bool favorite) { favorite_ = favorite; }
  const KRSet& selectedFilterTypes() const { return selectedFilterTypes_; }
  virtual void setSelectedFilterTypes(const KRSet& selectedFilterTypes) {
    selectedFilterTypes_ = selectedFilterTypes;
  }
  // The set's strings joined with the engine's delimiter, in the set's order; empty for no set.
  std::wstring selectedFilterTypesWString() const;
  // Splits at every delimiter and stores the pieces as the set (an empty text gives {""}), silently.
  void setSelectedFilterTypesWithWString(const std::wstring& selectedFilterTypes);

  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;

 protected:
  using KRDBEntity::KRDBEntity;

  // The store hook's shared part: the favorite flag where the record has one, then the set.
  template <class TypedRecord>
  bool storeAttributesFromRecord(const std::shared_ptr<TypedRecord>& record) {
    if constexpr (requires { record->favorite; }) favorite_ = record->favorite;
    setSelectedFilterTypesWithWString(record->selected_filter_types);
    return true;
  }
  // The setter protocol over a record of type TypedRecord: the flag compared by value, the set by identity.
  template <class TypedRecord>
  void setRecordFavorite(bool favorite) {
    setRecordValue(favorite_, favorite, kKRDBBaseFolderAttributesDidChangeFavorite, [this](bool value) {
      if (const auto record = std::dynamic_pointer_cast<TypedRecord>(dbentity())) record->favorite = value;
    });
  }
  template <class TypedRecord>
  void setRecordSelectedFilterTypes(const KRSet& selectedFilterTypes) {
    setRecordObject(selectedFilterTypes_, selectedFilterTypes,
                    kKRDBBaseFolderAttributesDidChangeSelectedFilterTypes, [this](const KRSet&) {
                      if (const auto record = std::dynamic_pointer_cast<TypedRecord>(dbentity())) {
                        record->selected_filter_types = selectedFilterTypesWString();
                      }
                    });
  }

 private:
  bool favorite_ = false;
  KRSet selectedFilterTypes_;
};
