#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"

#include <algorithm>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRSet.hpp"
#include "KRServices/KRLog.hpp"
#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRPrepareCondtionsHelper.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "dbconstants.hpp"
#include "dbimage.hpp"
#include "dbimgselectquery.hpp"

const KRString KRImagesConditionType = KRString::krs_stringWithWString(dbcore::kImagesConditionKey);
const KRString KRUserAttributesConditionType =
    KRString::krs_stringWithWString(dbcore::kUserAttributesConditionKey);
const KRString KRExivAttributesConditionType =
    KRString::krs_stringWithWString(dbcore::kExivAttributesConditionKey);

namespace {

const char* const kNotMarkedToDeletePredicate = "markedToDelete == NO";

// The pairs ordered so that a column containing another one is replaced first.
KRDBFilteredImagesFetchRequest::ColumnKeyPaths longestColumnFirst(
    KRDBFilteredImagesFetchRequest::ColumnKeyPaths pairs) {
  std::stable_sort(pairs.begin(), pairs.end(),
                   [](const auto& a, const auto& b) { return a.first.size() > b.first.size(); });
  return pairs;
}

void replaceAll(std::string& text, const std::string& target, const std::string& replacement) {
  for (size_t at = text.find(target); at != std::string::npos;
       at = text.find(target, at + replacement.size())) {
    text.replace(at, target.size(), replacement);
  }
}

// The folder path as a prefix: one trailing "/" (so that /a/bc does not lie under /a/b).
std::string folderPrefix(const KRString& path) {
  std::string text = path.str();
  while (!text.empty() && text.back() == '/') text.pop_back();
  return text + "/";
}

// Settings are compared as objects.
template <class T>
bool sameObject(const std::shared_ptr<T>& a, const std::shared_ptr<T>& b) {
  return a == b;
}
bool sameObject(const KRDictionary& a, const KRDictionary& b) { return identical(a, b); }

// Whether the engine makes a clause of the condition over T's table (joined or not gives the same answer).
template <class T>
bool engineAccepts(const std::string& condition) {
  return !dbcore::clauseWithCondition<T>(condition, false).empty();
}

bool evaluates(const KRPredicatePtr& predicate, const KRValue& object) {
  return predicate->evaluateWithObject(object);
}

}  // namespace

std::shared_ptr<KRDBFilteredImagesFetchRequest> KRDBFilteredImagesFetchRequest::init() {
  return std::make_shared<KRDBFilteredImagesFetchRequest>();
}

const KRDBFilteredImagesFetchRequest::ColumnKeyPaths& KRDBFilteredImagesFetchRequest::imageColumnKeyPaths() {
  static const ColumnKeyPaths pairs = longestColumnFirst({
      {"_id_int_64", "entityID.dbid"},
      {"guid_wide_ch", "guid"},
      {"path_wide_ch", "name"},
      {"file_size_int_64", "fileSize"},
      {"modification_date_int_64", "modificationDate.timeIntervalSince1970"},
      {"import_date_int_64", "importDate.timeIntervalSince1970"},
      {"import_index", "importIndex"},
  });
  return pairs;
}

const KRDBFilteredImagesFetchRequest::ColumnKeyPaths&
KRDBFilteredImagesFetchRequest::userAttributesColumnKeyPaths() {
  static const ColumnKeyPaths pairs = longestColumnFirst({
      {"_id_int_64", "entityID.dbid"},
      {"marked_to_delete_bool", "markedToDelete"},
      {"trash_bool", "trashed"},
      {"edit_date_int_64", "editDate.timeIntervalSince1970"},
      {"opened_bool", "opened"},
      {"origin_path_wide_ch", "originName"},
      {"lost_bool", "lost"},
  });
  return pairs;
}

const KRDBFilteredImagesFetchRequest::ColumnKeyPaths&
KRDBFilteredImagesFetchRequest::exivAttributesColumnKeyPaths() {
  static const ColumnKeyPaths pairs = longestColumnFirst({
      {"_id_int_64", "entityID.dbid"},
      {"marked_to_delete_bool", "markedToDelete"},
      {"iso_speed", "isoSpeed"},
      {"shutter_speed", "shutterSpeed"},
      {"number", "fNumber"},
      {"focal_len", "focalLength"},
      {"focal_len35mm", "focalLength35"},
      {"focal_len_min", "minFocalLength"},
      {"focal_len_max", "maxFocalLength"},
      {"shutter_min", "minShutter"},
      {"shutter_max", "maxShutter"},
      {"focus_distance", "focusDistance"},
      {"bits_per_sample", "bps"},
      {"white_balance", "whiteBalance"},
      {"white_balance_index", "whiteBalanceIndex"},
      {"light_source", "lightSource"},
      {"metering_mode", "meteringMode"},
      {"camera_maker_wide_ch", "cameraMaker"},
      {"camera_name_wide_ch", "cameraName"},
      {"camera_model_wide_ch", "cameraModel"},
      {"lens_maker_wide_ch", "lensMaker"},
      {"lens_pretty_name_wide_ch", "lensPrettyName"},
      {"date_time_int_64", "date.timeIntervalSince1970"},
      {"is_raw_bool", "raw"},
      {"is_full_filled_bool", "fullFilled"},
  });
  return pairs;
}

int64_t KRDBFilteredImagesFetchRequest::entityType() const { return KRDBEntityTypeImage; }

KRDBFilteredEntitiesFetchRequest::SelectQueryPtr KRDBFilteredImagesFetchRequest::makeSelectQuery() {
  auto query = std::make_shared<dbcore::DBImgSelectQuery>();
  std::vector<long long> filterIds;
  if (filters_) {
    for (const auto& filter : *filters_) filterIds.push_back(filter->entityID()->dbid());
  }
  query->Filters(std::move(filterIds));
  if (folder_) {
    const auto path = folder_->dbPath();
    query->PathPrefix(path ? path->dbpath() : nullptr);
  }
  query->Where(clauseSelectingNothingWhenRejected<dbcore::DBImage>(
      notMarkedToDeleteConditionWith(imageCondition().str()), false));
  const KRString userCondition = userAttributesCondition();
  if (!userCondition.empty()) {
    query->Join<dbcore::DBUserImgAttrib>(
        clauseSelectingNothingWhenRejected<dbcore::DBUserImgAttrib>(userCondition.str(), true));
  }
  const KRString exivCondition = exivAttributesCondition();
  if (!exivCondition.empty()) {
    query->Join<dbcore::DBExivImgAttrib>(
        clauseSelectingNothingWhenRejected<dbcore::DBExivImgAttrib>(exivCondition.str(), true));
  }
  return query;
}

void KRDBFilteredImagesFetchRequest::reset() {
  {
    const std::lock_guard lock(predicatesMutex_);
    wherePredicate_.reset();
    userAttributesPredicate_.reset();
    exivAttributesPredicate_.reset();
  }
  KRDBFilteredEntitiesFetchRequest::reset();
}

bool KRDBFilteredImagesFetchRequest::isEntitySatisfyingFilterConditions(
    const std::shared_ptr<KRDBEntity>& entity) {
  if (!entity) return false;
  try {
    if (!evaluates(wherePredicate(), KRValue(entity))) return false;
    const int64_t type = entity->entityID()->entityType();
    if (type == KRDBEntityTypeNone) return false;
    const auto image = type == KRDBEntityTypeImage ? std::dynamic_pointer_cast<KRDBImage>(entity) : nullptr;
    return isInFilters(image) && isInFolder(image) && isSatisfyingAttributes(image);
  } catch (const KRException&) {
    // A condition that does not parse as a predicate, or names a key the entities do not know, matches
    // nothing.
    return false;
  }
}

bool KRDBFilteredImagesFetchRequest::isInFilters(const std::shared_ptr<KRDBImage>& image) const {
  if (!filters_ || filters_->empty()) return true;
  if (!image) return false;
  const std::shared_ptr<KRDBEntity> member = image;
  return std::any_of(filters_->begin(), filters_->end(),
                     [&member](const std::shared_ptr<KRDBEntity>& entity) {
                       const auto filter = std::dynamic_pointer_cast<KRDBAbstractBaseFolder>(entity);
                       const auto images = filter ? filter->imagesPrimitive() : nullptr;
                       return images && images->contains(member);
                     });
}

bool KRDBFilteredImagesFetchRequest::isInFolder(const std::shared_ptr<KRDBImage>& image) const {
  if (!folder_) return true;
  const auto folderPath = folder_->dbPath();
  if (!folderPath) return true;
  if (!image) return false;
  const auto& imagePath = image->folderDBPath();
  if (!imagePath || imagePath->volumePrimitive() != folderPath->volumePrimitive()) return false;
  if (folderPath->path().empty()) return true;
  return folderPrefix(imagePath->path()).starts_with(folderPrefix(folderPath->path()));
}

bool KRDBFilteredImagesFetchRequest::isSatisfyingAttributes(const std::shared_ptr<KRDBImage>& image) {
  if (!image) return false;
  const auto& attributes = image->attributesPrimitive();
  if (!attributes || !evaluates(userAttributesPredicate(), KRValue(attributes))) return false;
  const auto& exivAttributes = image->exivAttributesPrimitive();
  return exivAttributes && evaluates(exivAttributesPredicate(), KRValue(exivAttributes));
}

KRString KRDBFilteredImagesFetchRequest::imageCondition() const {
  return conditionWithKey(KRImagesConditionType);
}

KRString KRDBFilteredImagesFetchRequest::userAttributesCondition() const {
  return conditionWithKey(KRUserAttributesConditionType);
}

KRString KRDBFilteredImagesFetchRequest::exivAttributesCondition() const {
  return conditionWithKey(KRExivAttributesConditionType);
}

KRString KRDBFilteredImagesFetchRequest::conditionWithKey(const KRString& kind) const {
  std::string text;
  const KRString filterCondition =
      filterConditions_ ? filterConditions_.objectForKey(kind).string() : KRString();
  if (filterCondition) text = "(" + filterCondition.str() + ")";
  const KRString customCondition =
      customConditions_ ? customConditions_.objectForKey(kind).string() : KRString();
  if (customCondition) {
    if (!text.empty()) text += " && ";
    text += "(" + customCondition.str() + ")";
  }
  return KRPrepareCondtionsHelper::prepareCondition(text);
}

std::string KRDBFilteredImagesFetchRequest::predicateFormatWithCondition(const std::string& condition,
                                                                         const ColumnKeyPaths& columns) {
  std::string text = condition;
  for (const auto& [column, keyPath] : columns) replaceAll(text, column, keyPath);
  replaceAll(text, "true", "YES");
  replaceAll(text, "false", "NO");
  return text;
}

KRPredicatePtr KRDBFilteredImagesFetchRequest::predicate(const PredicateSource& source) {
  {
    const std::lock_guard lock(predicatesMutex_);
    if (this->*source.slot) return this->*source.slot;
  }
  // The condition is prepared only when the predicate is made: the in-memory test asks for the cached
  // predicates on every entity.
  const KRString condition = (this->*source.condition)();
  KRPredicatePtr made;
  if (condition.empty()) {
    made = KRPredicate::predicateWithValue(true);
  } else if (!source.engineAccepts(condition.str())) {
    made = KRPredicate::predicateWithValue(false);
  } else {
    std::string format = predicateFormatWithCondition(condition.str(), source.columns);
    if (source.prefix) format = std::string(source.prefix) + " && " + format;
    made = KRPredicate::predicateWithFormat(format);
  }
  const std::lock_guard lock(predicatesMutex_);
  if (!(this->*source.slot)) this->*source.slot = std::move(made);
  return this->*source.slot;
}

void KRDBFilteredImagesFetchRequest::storePredicate(PredicateSlot slot, KRPredicatePtr predicate) {
  const std::lock_guard lock(predicatesMutex_);
  this->*slot = std::move(predicate);
}

KRPredicatePtr KRDBFilteredImagesFetchRequest::wherePredicate() {
  return predicate({&KRDBFilteredImagesFetchRequest::wherePredicate_,
                    &KRDBFilteredImagesFetchRequest::imageCondition, imageColumnKeyPaths(),
                    kNotMarkedToDeletePredicate, &engineAccepts<dbcore::DBImage>});
}

KRPredicatePtr KRDBFilteredImagesFetchRequest::userAttributesPredicate() {
  return predicate({&KRDBFilteredImagesFetchRequest::userAttributesPredicate_,
                    &KRDBFilteredImagesFetchRequest::userAttributesCondition, userAttributesColumnKeyPaths(),
                    nullptr, &engineAccepts<dbcore::DBUserImgAttrib>});
}

KRPredicatePtr KRDBFilteredImagesFetchRequest::exivAttributesPredicate() {
  return predicate({&KRDBFilteredImagesFetchRequest::exivAttributesPredicate_,
                    &KRDBFilteredImagesFetchRequest::exivAttributesCondition, exivAttributesColumnKeyPaths(),
                    nullptr, &engineAccepts<dbcore::DBExivImgAttrib>});
}

void KRDBFilteredImagesFetchRequest::setWherePredicate(KRPredicatePtr predicate) {
  storePredicate(&KRDBFilteredImagesFetchRequest::wherePredicate_, std::move(predicate));
}

void KRDBFilteredImagesFetchRequest::setUserAttributesPredicate(KRPredicatePtr predicate) {
  storePredicate(&KRDBFilteredImagesFetchRequest::userAttributesPredicate_, std::move(predicate));
}

void KRDBFilteredImagesFetchRequest::setExivAttributesPredicate(KRPredicatePtr predicate) {
  storePredicate(&KRDBFilteredImagesFetchRequest::exivAttributesPredicate_, std::move(predicate));
}

template <class T>
void KRDBFilteredImagesFetchRequest::replaceSetting(T& field, T value) {
  if (sameObject(field, value)) return;
  field = std::move(value);
  reset();
}

void KRDBFilteredImagesFetchRequest::setFilters(FiltersPtr filters) {
  replaceSetting(filters_, std::move(filters));
}

void KRDBFilteredImagesFetchRequest::setFolder(std::shared_ptr<KRDBReferencedFolder> folder) {
  replaceSetting(folder_, std::move(folder));
}

void KRDBFilteredImagesFetchRequest::setFilterConditions(KRDictionary conditions) {
  replaceSetting(filterConditions_, std::move(conditions));
}

void KRDBFilteredImagesFetchRequest::setCustomConditions(KRDictionary conditions) {
  replaceSetting(customConditions_, std::move(conditions));
}

KRValue KRDBFilteredImagesFetchRequest::valueForKey(const std::string& key) const {
  if (key == "filters") {
    if (!filters_) return {};
    return KRSet(std::vector<KRValue>(filters_->begin(), filters_->end()));
  }
  if (key == "folder") return folder_;
  if (key == "filterConditions") return filterConditions_;
  if (key == "customConditions") return customConditions_;
  if (key == "imageCondition") return imageCondition();
  if (key == "userAttributesCondition") return userAttributesCondition();
  if (key == "exivAttributesCondition") return exivAttributesCondition();
  return KRDBFilteredEntitiesFetchRequest::valueForKey(key);
}

void KRDBFilteredImagesFetchRequest::setValueForKey(const KRValue& value, const std::string& key) {
  if (key == "folder") return setFolder(value.objectAs<KRDBReferencedFolder>());
  if (key == "filterConditions") return setFilterConditions(value.dictionary());
  if (key == "customConditions") return setCustomConditions(value.dictionary());
  if (key == "filters") {
    if (value.isNil()) return setFilters(nullptr);
    auto filters = std::make_shared<KRDBEntitySet>();
    for (const KRValue& member : value.set().allObjects()) {
      if (auto entity = member.objectAs<KRDBEntity>()) filters->insert(std::move(entity));
    }
    return setFilters(std::move(filters));
  }
  KRDBFilteredEntitiesFetchRequest::setValueForKey(value, key);
}

void KRDBFilteredImagesFetchRequest::setValueForUndefinedKey(const KRValue& /*value*/,
                                                             const std::string& key) {
  KRLog(KRLogLevelWarning, "Warning!!!\nUndefined Key: %@\nFor obj Class: %@", key, className());
}
