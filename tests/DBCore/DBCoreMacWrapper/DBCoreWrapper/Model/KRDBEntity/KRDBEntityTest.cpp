#include "Model/KRDBEntity/KRDBEntity.hpp"

#include <gtest/gtest.h>

#include "KREntityObserverRecorder.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRRecordingEntityContext.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "Model/KRDBEntity/KRDBEntityClasses.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "dbentityfavoritealias.hpp"
#include "dbimage.hpp"
#include "dbpath.hpp"

namespace {

using dbcore::DBImage;

const char* const kTitleKey = "kKRTestEntityDidChangeTitle";

// An entity over image records with one field kept in the record (the image's path, as a title) and two
// necessary linked entities. Its record type is 0, so it never enters the registry.
class KRTestEntity : public KRDBConcreteEntity<KRTestEntity, KRDBEntity, 99, 0> {
 public:
  static const std::vector<std::string>& necessaryLinkedEntitiesKeys() {
    static const std::vector<std::string> keys{"linked", "other"};
    return keys;
  }
  bool storeInfoFromDBentity(const Record& record) override {
    return storeInfoWithHook(record, &KRTestEntity::storeInfoFromTestImage);
  }
  const KRString& title() const { return title_; }
  void setTitle(const KRString& title) {
    setRecordValue(title_, title, kTitleKey,
                   [this](const KRString& value) { image()->path = value.krs_wstring(); });
  }
  std::shared_ptr<DBImage> image() const { return std::dynamic_pointer_cast<DBImage>(dbentity()); }
  void postRelationChange() { didChangeWithoutRecord(); }

  KRValue valueForKey(const std::string& key) const override {
    if (key == "linked") return linked;
    if (key == "other") return other;
    return KRDBEntity::valueForKey(key);
  }
  void setValueForKey(const KRValue& value, const std::string& key) override {
    if (key == "linked") return void(linked = value.objectAs<KRDBEntity>());
    if (key == "other") return void(other = value.objectAs<KRDBEntity>());
    KRDBEntity::setValueForKey(value, key);
  }

  KRDBEntityPtr linked;
  KRDBEntityPtr other;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  bool storeInfoFromTestImage(const std::shared_ptr<DBImage>& image) {
    title_ = KRString::krs_stringWithWString(image->path);
    return true;
  }

 private:
  KRString title_;
};

// An exif reader as creation infos carry it: it knows the url of its file.
class KRTestExifReader : public KRObject {
 public:
  explicit KRTestExifReader(KRValue url) : url_(std::move(url)) {}
  KRValue valueForKey(const std::string& key) const override {
    if (key == "url" && !url_.isNil()) return url_;
    return KRObject::valueForKey(key);
  }

 private:
  KRValue url_;
};

std::shared_ptr<DBImage> imageRecord(int64_t id, const std::wstring& path = L"IMG_1.CR3") {
  auto image = std::make_shared<DBImage>();
  image->set_id(id);
  image->path = path;
  return image;
}

std::shared_ptr<KRDBEntityFavoriteAlias> makeAlias(int64_t id) {
  auto record = std::make_shared<dbcore::DBEntityFavoriteAlias>();
  record->set_id(id);
  return KRDBEntityFavoriteAlias::initWithDBEntity(record);
}

class KRDBEntityTest : public testing::Test {
 protected:
  void SetUp() override { KRDBEntityClasses::registerAll(); }

  std::shared_ptr<KRTestEntity> entity = KRTestEntity::initWithDBEntity(imageRecord(42));
  std::shared_ptr<KREntityObserverRecorder> observer = KREntityObserverRecorder::observing(*entity);
};

// ---- Construction

TEST_F(KRDBEntityTest, ANewEntityTakesItsIdentityAndRecordFromTheRecord) {
  auto record = imageRecord(7);
  record->set_marked_to_delete(true);
  const auto made = KRTestEntity::initWithDBEntity(record);
  ASSERT_TRUE(made);
  EXPECT_EQ(made->entityID()->entityType(), KRDBEntityTypeImage);
  EXPECT_EQ(made->entityID()->dbid(), 7);
  EXPECT_EQ(made->dbentity(), record);
  EXPECT_TRUE(made->isMarkedToDelete());
  EXPECT_EQ(made->title(), KRString("IMG_1.CR3"));
  EXPECT_FALSE(made->isDbEntityChanged());
  EXPECT_FALSE(made->validationRecord());
}

TEST_F(KRDBEntityTest, NoRecordGivesNoEntity) { EXPECT_FALSE(KRTestEntity::initWithDBEntity(nullptr)); }

TEST_F(KRDBEntityTest, PlainConstructionIsRefused) {
  static_assert(!std::is_default_constructible_v<KRTestEntity>);
  static_assert(!std::is_constructible_v<KRTestEntity, KRDBEntity::Record>);
  EXPECT_TRUE(entity);
}

TEST_F(KRDBEntityTest, AClassWithoutARecordTypeIsNotRegistered) {
  KRTestEntity::registerEntityClass();
  EXPECT_EQ(KRDBEntity::entityClassForDBEntityType(0), nullptr);
  EXPECT_EQ(KRDBEntity::entityClassForDBEntityType(dbcore::kDBImageType), &KRDBImage::classInfo());
}

TEST_F(KRDBEntityTest, TheStoreHookRefusesARecordOfAnotherClass) {
  const auto path = std::make_shared<dbcore::DBPath>();
  path->set_marked_to_delete(true);
  EXPECT_FALSE(entity->storeInfoFromDBentity(path));
  EXPECT_FALSE(entity->storeInfoFromDBentity(nullptr));
  EXPECT_TRUE(entity->storeInfoFromDBentity(imageRecord(42, L"other.jpg")));
  EXPECT_EQ(entity->title(), KRString("other.jpg"));
}

TEST_F(KRDBEntityTest, ACopyWrapsADeepCopyOfTheRecordWithoutContextAliasOrValidationRecord) {
  const auto image = KRDBImage::initWithDBEntity(imageRecord(9, L"copy.jpg"));
  const auto context = std::make_shared<KRRecordingEntityContext>();
  image->setContext(context);
  image->setFavoriteAliasPrimitive(makeAlias(3));
  image->setValidationRecord(imageRecord(9));
  const auto copy = image->copyEntity();
  ASSERT_TRUE(std::dynamic_pointer_cast<KRDBImage>(copy));
  EXPECT_NE(copy, image);
  EXPECT_NE(copy->dbentity(), image->dbentity());
  EXPECT_EQ(copy->dbentity()->column_values(), image->dbentity()->column_values());
  EXPECT_TRUE(copy->entityID()->isEqual(image->entityID()));
  EXPECT_FALSE(copy->context());
  EXPECT_FALSE(copy->favoriteAlias());
  EXPECT_FALSE(copy->validationRecord());
}

// ---- Setter protocol and change notifications

TEST_F(KRDBEntityTest, SettingAFieldToItsCurrentValuePostsNothing) {
  entity->setTitle(KRString(std::string("IMG_1.CR3")));
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(entity->isDbEntityChanged());
}

TEST_F(KRDBEntityTest, SettingAFieldWritesTheRecordBetweenWillAndDidChange) {
  entity->setValidationRecord(imageRecord(42));
  observer->events.clear();
  entity->setTitle("new.jpg");
  EXPECT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
  EXPECT_TRUE(observer->events[0].info.isNil());
  EXPECT_EQ(observer->events[1].info, KRDictionary({{kTitleKey, true}}));
  EXPECT_EQ(entity->image()->path, L"new.jpg");
  EXPECT_TRUE(entity->isDbEntityChanged());
  EXPECT_FALSE(entity->validationRecord());
}

TEST_F(KRDBEntityTest, MarkingToDeletePostsTheFlagSetsChangedAndDropsTheValidationRecord) {
  entity->setValidationRecord(imageRecord(42));
  observer->events.clear();
  entity->setMarkedToDelete(true);
  EXPECT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
  EXPECT_EQ(observer->events[1].info, KRDictionary({{"KRDBEntityMarkedToDelete", true}}));
  EXPECT_TRUE(entity->isMarkedToDelete());
  EXPECT_TRUE(entity->dbentity()->marked_to_delete());
  EXPECT_TRUE(entity->isDbEntityChanged());
  EXPECT_FALSE(entity->validationRecord());
  observer->events.clear();
  entity->setMarkedToDelete(true);
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBEntityTest, TheMarkerKeysKeepTheirValues) {
  EXPECT_STREQ(kKRDBEntityDidNotChange, "kKRDBEntityDidNotChange");
  EXPECT_STREQ(kKRDBEntityMarkedToDelete, "KRDBEntityMarkedToDelete");
}

TEST_F(KRDBEntityTest, AChangeMarkedAsNotOfTheRecordKeepsTheFlagsAndHidesTheMarker) {
  const auto validation = imageRecord(42);
  entity->setValidationRecord(validation);
  observer->events.clear();
  entity->didChange({{kKRDBEntityDidNotChange, true}, {"relation", true}});
  EXPECT_FALSE(entity->isDbEntityChanged());
  EXPECT_EQ(entity->validationRecord(), validation);
  ASSERT_EQ(observer->events.size(), 1u);
  EXPECT_EQ(observer->events[0].info, KRDictionary({{"relation", true}}));
}

TEST_F(KRDBEntityTest, AChangeWithOnlyTheMarkerArrivesEmptyAndOneWithoutInfoArrivesWithout) {
  entity->didChange({{kKRDBEntityDidNotChange, true}});
  entity->didChange({});
  ASSERT_EQ(observer->events.size(), 2u);
  EXPECT_FALSE(observer->events[0].info.isNil());
  EXPECT_EQ(observer->events[0].info.count(), 0u);
  EXPECT_TRUE(observer->events[1].info.isNil());
  EXPECT_TRUE(entity->isDbEntityChanged());
}

TEST_F(KRDBEntityTest, AMarkerThatIsFalseCountsAsARecordChange) {
  entity->didChange({{kKRDBEntityDidNotChange, false}});
  EXPECT_TRUE(entity->isDbEntityChanged());
  EXPECT_EQ(observer->events[0].info.count(), 0u);
}

TEST_F(KRDBEntityTest, ARelationChangeIsPostedAsNotARecordChange) {
  entity->postRelationChange();
  ASSERT_EQ(observer->events.size(), 1u);
  EXPECT_EQ(observer->events[0].info.count(), 0u);
  EXPECT_FALSE(entity->isDbEntityChanged());
}

TEST_F(KRDBEntityTest, WillChangePassesTheInfoUnchanged) {
  const KRDictionary info{{kKRDBEntityDidNotChange, true}};
  entity->willChange(info);
  ASSERT_EQ(observer->events.size(), 1u);
  EXPECT_TRUE(identical(observer->events[0].info, info));
}

TEST_F(KRDBEntityTest, TheValidationRecordNotifiesOnlyForANewNonEmptyRecord) {
  const auto validation = imageRecord(42);
  entity->setValidationRecord(validation);
  entity->setValidationRecord(validation);
  entity->resetValidationRecord();
  EXPECT_EQ(observer->kinds(), std::vector<std::string>{"validationRecordDidSet"});
  EXPECT_FALSE(entity->validationRecord());
}

// ---- Updates from fresher records

TEST_F(KRDBEntityTest, AnUpdateFromAnotherRecordAnswersFalseAndPostsNothing) {
  EXPECT_FALSE(entity->updateWithDBEntity(imageRecord(43, L"x.jpg")));
  auto path = std::make_shared<dbcore::DBPath>();
  path->set_id(42);
  EXPECT_FALSE(entity->updateWithDBEntity(path));
  EXPECT_FALSE(entity->updateWithDBEntity(nullptr));
  EXPECT_TRUE(observer->events.empty());
  EXPECT_EQ(entity->title(), KRString("IMG_1.CR3"));
}

TEST_F(KRDBEntityTest, ASilentUpdateTakesTheValuesAndPostsNothing) {
  const auto held = entity->dbentity();
  const auto validation = imageRecord(42);
  entity->setValidationRecord(validation);
  observer->events.clear();
  auto fresher = imageRecord(42, L"renamed.jpg");
  fresher->set_marked_to_delete(true);
  EXPECT_TRUE(entity->updateWithDBEntity(fresher, true));
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(entity->isDbEntityChanged());
  EXPECT_EQ(entity->validationRecord(), validation);
  EXPECT_EQ(entity->dbentity(), held);
  EXPECT_EQ(entity->image()->path, L"renamed.jpg");
  EXPECT_EQ(entity->title(), KRString("renamed.jpg"));
  EXPECT_TRUE(entity->isMarkedToDelete());
}

TEST_F(KRDBEntityTest, ALoudUpdatePostsAroundTheChangeAndMarksTheEntity) {
  entity->setValidationRecord(imageRecord(42));
  observer->events.clear();
  EXPECT_TRUE(entity->updateWithDBEntity(imageRecord(42, L"renamed.jpg")));
  EXPECT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
  EXPECT_TRUE(observer->events[1].info.isNil());
  EXPECT_TRUE(entity->isDbEntityChanged());
  EXPECT_FALSE(entity->validationRecord());
}

// ---- Necessary linked entities

TEST_F(KRDBEntityTest, AClassWithoutNecessaryKeysNeedsNothing) {
  const auto state = KRDBImageState::initWithDBEntity(std::make_shared<dbcore::DBImgHistoryState>());
  EXPECT_TRUE(KRDBEntity::necessaryLinkedEntitiesKeys().empty());
  EXPECT_TRUE(KRDBImageState::necessaryLinkedEntitiesKeys().empty());
  EXPECT_FALSE(state->needFetchNecessaryEntities());
  EXPECT_EQ(state->necessaryLinkedEntitiesDictionary().count(), 0u);
}

TEST_F(KRDBEntityTest, AMissingNecessaryEntityIsNeededAndLeftOutOfTheDictionary) {
  EXPECT_TRUE(entity->needFetchNecessaryEntities());
  const auto linked = KRDBImage::initWithDBEntity(imageRecord(2));
  entity->updateNecessaryEntityForKey("linked", linked);
  EXPECT_TRUE(entity->needFetchNecessaryEntities());
  EXPECT_EQ(entity->necessaryLinkedEntitiesDictionary(), KRDictionary({{"linked", linked}}));
  entity->updateNecessaryEntityForKey("other", linked);
  EXPECT_FALSE(entity->needFetchNecessaryEntities());
  EXPECT_EQ(entity->necessaryLinkedEntitiesDictionary().count(), 2u);
}

TEST_F(KRDBEntityTest, OnlyNecessaryKeysAreUpdated) {
  const auto linked = KRDBImage::initWithDBEntity(imageRecord(2));
  entity->updateNecessaryEntityForKey("markedToDelete", linked);
  entity->updateNecessaryEntityForKey("unknown", linked);
  EXPECT_FALSE(entity->isMarkedToDelete());
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBEntityTest, SettingTheCountToZeroWhenItIsZeroCallsNoCompletion) {
  int calls = 0;
  entity->pushCompletionFetchingNecessaryEntities([&calls] { ++calls; });
  entity->setNecesserryEntitiesToFetchCount(0);
  EXPECT_EQ(calls, 0);
  EXPECT_EQ(entity->necessaryEntitiesFetchingCompletions().size(), 1u);
}

TEST_F(KRDBEntityTest, TheCountReachingZeroCallsEveryCompletionOnceInOrder) {
  std::vector<int> order;
  entity->setNecesserryEntitiesToFetchCount(2);
  entity->pushCompletionFetchingNecessaryEntities([&order] { order.push_back(1); });
  entity->pushCompletionFetchingNecessaryEntities([&order] { order.push_back(2); });
  entity->setNecesserryEntitiesToFetchCount(1);
  EXPECT_TRUE(order.empty());
  entity->setNecesserryEntitiesToFetchCount(0);
  EXPECT_EQ(order, (std::vector<int>{1, 2}));
  EXPECT_TRUE(entity->necessaryEntitiesFetchingCompletions().empty());
  entity->setNecesserryEntitiesToFetchCount(2);
  entity->setNecesserryEntitiesToFetchCount(0);
  EXPECT_EQ(order.size(), 2u);
  EXPECT_EQ(entity->necesserryEntitiesToFetchCount(), 0u);
}

// ---- Favorite alias

TEST_F(KRDBEntityTest, WithoutAContextNoAliasIsMade) {
  entity->createFavoriteAliasIfNeeded();
  EXPECT_FALSE(entity->favoriteAlias());
}

TEST_F(KRDBEntityTest, TheContextsAliasIsKeptAndPointsBackAtTheEntity) {
  const auto context = std::make_shared<KRRecordingEntityContext>();
  context->alias = makeAlias(5);
  entity->setContext(context);
  KRCapturingLogSink sink;
  entity->createFavoriteAliasIfNeeded();
  EXPECT_EQ(entity->favoriteAlias(), context->alias);
  EXPECT_EQ(context->alias->originalEntityPrimitive(), entity);
  entity->createFavoriteAliasIfNeeded();
  EXPECT_EQ(context->calls, std::vector<std::string>{"favoriteAliasForEntity"});
  EXPECT_TRUE(sink.records().empty());
}

TEST_F(KRDBEntityTest, AnAliasOfAnotherEntityIsReportedAndTakenOver) {
  const auto context = std::make_shared<KRRecordingEntityContext>();
  context->alias = makeAlias(5);
  const auto previous = KRDBImage::initWithDBEntity(imageRecord(8));
  context->alias->setOriginalEntityPrimitive(previous);
  entity->setContext(context);
  KRCapturingLogSink sink;
  entity->createFavoriteAliasIfNeeded();
  const std::vector<KRLogRecord> records = sink.records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0], (KRLogRecord{2, "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBEntity/KRDBEntity",
                                     "createFavoriteAliasIfNeeded", 38,
                                     "Error: Inconsistence in favoriteAlias - entity relation"}));
  EXPECT_EQ(context->alias->originalEntityPrimitive(), entity);
}

TEST_F(KRDBEntityTest, AGoneContextIsNotAsked) {
  auto context = std::make_shared<KRRecordingEntityContext>();
  entity->setContext(context);
  context.reset();
  EXPECT_FALSE(entity->context());
  entity->createFavoriteAliasIfNeeded();
  EXPECT_FALSE(entity->favoriteAlias());
}

TEST_F(KRDBEntityTest, ResetToDefaultStateUnmarksTheEntityAndItsAlias) {
  const auto alias = makeAlias(5);
  alias->setFavorite(true);
  alias->setMarkedToDelete(true);
  entity->setFavoriteAliasPrimitive(alias);
  entity->setMarkedToDelete(true);
  entity->resetToDefaultState();
  EXPECT_FALSE(entity->isMarkedToDelete());
  EXPECT_FALSE(alias->isMarkedToDelete());
  EXPECT_FALSE(alias->isFavorite());
}

TEST_F(KRDBEntityTest, ResetDropsTheAliasWithoutNotification) {
  entity->setFavoriteAliasPrimitive(makeAlias(5));
  entity->reset();
  EXPECT_FALSE(entity->favoriteAliasPrimitive());
  EXPECT_TRUE(observer->events.empty());
}

// ---- Deletion keys

TEST_F(KRDBEntityTest, TheBaseHasNoDeletionKey) { EXPECT_TRUE(entity->markedToDeleteHashKey().isNil()); }

TEST_F(KRDBEntityTest, AnImagesDeletionKeyComesFromItsExifReadersUrl) {
  const KRDictionary info{{"DBImageInfoExifReader", std::make_shared<KRTestExifReader>("/photos/a.jpg")}};
  EXPECT_EQ(KRDBEntity::markedToDeleteHashKeyForEntityType(1, info), KRString("1-/photos/a.jpg"));
  const KRDictionary withoutUrl{{"DBImageInfoExifReader", std::make_shared<KRTestExifReader>(KRValue())}};
  EXPECT_TRUE(KRDBEntity::markedToDeleteHashKeyForEntityType(1, withoutUrl).isNil());
  EXPECT_TRUE(KRDBEntity::markedToDeleteHashKeyForEntityType(1, {}).isNil());
}

TEST_F(KRDBEntityTest, AReferencedFoldersDeletionKeyComesFromItsPath) {
  EXPECT_EQ(KRDBEntity::markedToDeleteHashKeyForEntityType(3, {{"DBPathInfoPath", "/photos"}}),
            KRString("3-/photos"));
  EXPECT_TRUE(KRDBEntity::markedToDeleteHashKeyForEntityType(3, {{"other", "/photos"}}).isNil());
}

TEST_F(KRDBEntityTest, OtherTypesHaveNoDeletionKeyEvenWithAPath) {
  EXPECT_TRUE(KRDBEntity::markedToDeleteHashKeyForEntityType(4, {{"DBPathInfoPath", "/photos"}}).isNil());
  EXPECT_TRUE(KRDBEntity::markedToDeleteHashKeyForEntityType(2, {{"DBPathInfoPath", "/photos"}}).isNil());
}

// ---- Annotations and key-value coding

TEST_F(KRDBEntityTest, AdditionalInfoIsMadeOnFirstReadAndKept) {
  entity->additionalInfo()["note"] = "kept";
  EXPECT_EQ(entity->additionalInfo().at("note"), KRValue("kept"));
}

TEST_F(KRDBEntityTest, BasePropertiesAreReachedByKey) {
  EXPECT_EQ(entity->valueForKey("markedToDelete"), KRValue(false));
  EXPECT_EQ(entity->valueForKey("entityID").object(), entity->entityID());
  entity->setValueForKey(true, "markedToDelete");
  EXPECT_TRUE(entity->isMarkedToDelete());
  EXPECT_EQ(entity->valueForKey("dbEntityChanged"), KRValue(true));
  const auto alias = makeAlias(5);
  entity->setValueForKey(alias, "favoriteAliasPrimitive");
  EXPECT_EQ(entity->valueForKey("favoriteAlias").object(), alias);
  EXPECT_THROW(entity->valueForKey("noSuchKey"), KRException);
}

}  // namespace
