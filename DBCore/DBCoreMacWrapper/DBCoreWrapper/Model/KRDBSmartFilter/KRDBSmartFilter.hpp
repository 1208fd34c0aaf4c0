#pragma once

#include <memory>
#include <string>

#include "KRFoundation/KRValue.hpp"
#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbsmartfilter.hpp"

// A saved set of conditions, over a dbcore::DBSmartFilter record: its identifier, name and two condition
// dictionaries (condition kind to condition text) kept in the record as JSON. Its fields are read-only views
// of the record; smart filters are not ordered by the user. Used on its context's thread.
class KRDBSmartFilter : public KRDBConcreteEntity<KRDBSmartFilter, KRDBAbstractBaseFolder,
                                                  KRDBEntityTypeSmartFilter, dbcore::kDBSmartFilterType> {
 public:
  // The dictionary of a JSON object text, or nil for text that is not one.
  static KRDictionary conditionsDictionaryFromJsonWString(const std::wstring& json);

  bool storeInfoFromDBentity(const Record& record) override;
  std::shared_ptr<dbcore::DBSmartFilter> dbsmartfilter() const;

  const KRDictionary& filterConditions() const { return filterConditions_; }
  const KRDictionary& applyingConditions() const { return applyingConditions_; }
  const KRString& identifier() const { return identifier_; }
  // Always 0.0, whatever the record holds.
  double order() const override { return 0.0; }

  KRValue valueForKey(const std::string& key) const override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBSmartFilter(const std::shared_ptr<dbcore::DBSmartFilter>& smartFilter);

 private:
  KRDictionary filterConditions_;
  KRDictionary applyingConditions_;
  KRString identifier_;
};
