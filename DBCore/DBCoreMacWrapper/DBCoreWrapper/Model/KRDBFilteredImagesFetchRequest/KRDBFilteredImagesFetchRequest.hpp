#pragma once

#include <memory>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

#include "KRFoundation/KRDictionary.hpp"
#include "KRFoundation/KRPredicate.hpp"
#include "KRFoundation/KRString.hpp"
#include "Model/KRDBEntity/KRDBEntityContext.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBFilteredEntitiesFetchRequest.hpp"

// The condition kinds of condition dictionaries: the engine's own keys.
extern const KRString KRImagesConditionType;
extern const KRString KRUserAttributesConditionType;
extern const KRString KRExivAttributesConditionType;

// The request for images: restricted to collections or smart filters (`filters`), to a referenced
// folder's tree (`folder`) and by conditions in the engine's condition language on the image, its user
// attributes and its exif attributes (`filterConditions` and `customConditions`, by condition kind). The
// engine query is built from the conditions; the in-memory test evaluates platform predicates rewritten
// from them (column names replaced by key paths). Configure it on one thread; once configured, the query,
// the predicates and the in-memory test may be used from several threads at once (the caches are
// guarded; entities are read through their cached values only).
class KRDBFilteredImagesFetchRequest final : public KRDBFilteredEntitiesFetchRequest {
 public:
  using FiltersPtr = std::shared_ptr<const KRDBEntitySet>;
  // Column name and key path pairs, longest column name first.
  using ColumnKeyPaths = std::vector<std::pair<std::string, std::string>>;

  static std::shared_ptr<KRDBFilteredImagesFetchRequest> init();

  // The column to key path tables of the three predicates.
  static const ColumnKeyPaths& imageColumnKeyPaths();
  static const ColumnKeyPaths& userAttributesColumnKeyPaths();
  static const ColumnKeyPaths& exivAttributesColumnKeyPaths();

  int64_t entityType() const override;
  SelectQueryPtr makeSelectQuery() override;
  // Drops the predicates, then the query.
  void reset() override;
  bool isEntitySatisfyingFilterConditions(const std::shared_ptr<KRDBEntity>& entity) override;

  // ---- Conditions, prepared anew on every call
  KRString imageCondition() const;
  KRString userAttributesCondition() const;
  KRString exivAttributesCondition() const;
  // "(filter condition)", " && " and "(custom condition)" as far as they are given for the kind, with the
  // computed sub-expressions expanded.
  KRString conditionWithKey(const KRString& kind) const;

  // ---- Predicates, made from the conditions on first use (always true for an empty condition). A
  // condition whose rewriting does not parse raises the platform's parse error.
  KRPredicatePtr wherePredicate();
  KRPredicatePtr userAttributesPredicate();
  KRPredicatePtr exivAttributesPredicate();
  void setWherePredicate(KRPredicatePtr predicate);
  void setUserAttributesPredicate(KRPredicatePtr predicate);
  void setExivAttributesPredicate(KRPredicatePtr predicate);

  // ---- Settings: the same object changes nothing; another one is stored and resets the request.
  const FiltersPtr& filters() const { return filters_; }
  void setFilters(FiltersPtr filters);
  const std::shared_ptr<KRDBReferencedFolder>& folder() const { return folder_; }
  void setFolder(std::shared_ptr<KRDBReferencedFolder> folder);
  const KRDictionary& filterConditions() const { return filterConditions_; }
  void setFilterConditions(KRDictionary conditions);
  const KRDictionary& customConditions() const { return customConditions_; }
  void setCustomConditions(KRDictionary conditions);

  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;
  // Logs a warning and ignores the value.
  void setValueForUndefinedKey(const KRValue& value, const std::string& key) override;

  // The predicate text of a condition: every column replaced by its key path, "true" by "YES", "false"
  // by "NO" (plain substring replacement, literals included).
  static std::string predicateFormatWithCondition(const std::string& condition,
                                                  const ColumnKeyPaths& columns);

 private:
  using PredicateSlot = KRPredicatePtr KRDBFilteredImagesFetchRequest::*;
  using ConditionGetter = KRString (KRDBFilteredImagesFetchRequest::*)() const;
  // Where one predicate comes from: its cache slot, its condition, the column table that rewrites it,
  // an optional predicate put before it, and whether the engine accepts the condition for its table.
  struct PredicateSource {
    PredicateSlot slot;
    ConditionGetter condition;
    const ColumnKeyPaths& columns;
    const char* prefix;
    bool (*engineAccepts)(const std::string& condition);
  };

  // The cached predicate of the source's slot, made from its condition when there is none. A condition
  // the engine rejects (and so selects nothing with) makes a predicate that accepts nothing.
  KRPredicatePtr predicate(const PredicateSource& source);
  void storePredicate(PredicateSlot slot, KRPredicatePtr predicate);
  template <class T>
  void replaceSetting(T& field, T value);
  // Steps of the in-memory test after the image predicate.
  bool isInFilters(const std::shared_ptr<KRDBImage>& image) const;
  bool isInFolder(const std::shared_ptr<KRDBImage>& image) const;
  bool isSatisfyingAttributes(const std::shared_ptr<KRDBImage>& image);

  std::mutex predicatesMutex_;
  KRPredicatePtr wherePredicate_;
  KRPredicatePtr userAttributesPredicate_;
  KRPredicatePtr exivAttributesPredicate_;
  FiltersPtr filters_;
  std::shared_ptr<KRDBReferencedFolder> folder_;
  KRDictionary filterConditions_;
  KRDictionary customConditions_;
};

using KRDBFilteredImagesFetchRequestPtr = std::shared_ptr<KRDBFilteredImagesFetchRequest>;
