#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"

#include <gtest/gtest.h>

#include "KREntityObserverRecorder.hpp"
#include "KRRecordingEntityContext.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBCollectionAttributes/KRDBCollectionAttributes.hpp"
#include "Model/KRDBEntity/KRDBEntityClasses.hpp"

namespace {

using EntitySetPtr = KRDBAbstractBaseFolder::EntitySetPtr;

// The base's behaviour is reached through collections, its simplest kind.
std::shared_ptr<KRDBCollection> collection(int64_t id = 1) {
  auto record = std::make_shared<dbcore::DBFilter>();
  record->set_id(id);
  return KRDBCollection::initWithDBEntity(record);
}

EntitySetPtr setOf(std::initializer_list<std::shared_ptr<KRDBEntity>> entities) {
  return std::make_shared<const KRDBEntitySet>(entities);
}

class KRDBAbstractBaseFolderTest : public testing::Test {
 protected:
  void SetUp() override {
    KRDBEntityClasses::registerAll();
    folder->setContext(context);
    observer = KREntityObserverRecorder::observing(*folder);
  }
  // The notifications of a relation change: the marker is removed and the entity stays unchanged.
  void expectOneRelationChange() {
    ASSERT_EQ(observer->kinds(), std::vector<std::string>{"didChange"});
    EXPECT_EQ(observer->events[0].info, KRDictionary::dictionary());
    EXPECT_FALSE(folder->isDbEntityChanged());
    observer->events.clear();
  }

  std::shared_ptr<KRRecordingEntityContext> context = std::make_shared<KRRecordingEntityContext>();
  std::shared_ptr<KRDBCollection> folder = collection();
  std::shared_ptr<KREntityObserverRecorder> observer;
  std::shared_ptr<KRDBEntity> a = collection(2), b = collection(3), c = collection(4);
};

TEST_F(KRDBAbstractBaseFolderTest, ChangeKeysAreTheirOwnNames) {
  EXPECT_STREQ(kKRDBBaseFolderDidChangeName, "kKRDBBaseFolderDidChangeName");
  EXPECT_STREQ(kKRDBBaseFolderDidChangeOrder, "kKRDBBaseFolderDidChangeOrder");
}

TEST_F(KRDBAbstractBaseFolderTest, TheAttributeRecordIsTheNecessaryLink) {
  EXPECT_EQ(KRDBAbstractBaseFolder::necessaryLinkedEntitiesKeys(),
            std::vector<std::string>{"attributesPrimitive"});
  EXPECT_EQ(KRDBCollection::necessaryLinkedEntitiesKeys(), std::vector<std::string>{"attributesPrimitive"});
  EXPECT_TRUE(folder->needFetchNecessaryEntities());
  const auto attributes =
      KRDBCollectionAttributes::initWithDBEntity(std::make_shared<dbcore::DBFilterAttrib>());
  folder->updateNecessaryEntityForKey("attributesPrimitive", attributes);
  EXPECT_EQ(folder->attributes(), attributes);
  EXPECT_EQ(folder->attributesPrimitive(), attributes);
  EXPECT_FALSE(folder->needFetchNecessaryEntities());
  EXPECT_EQ(folder->necessaryLinkedEntitiesDictionary(),
            KRDictionary({{"attributesPrimitive", KRValue(attributes)}}));
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBAbstractBaseFolderTest, WithoutAContextTheRelationsAreNil) {
  const auto orphan = collection();
  EXPECT_EQ(orphan->parent(), nullptr);
  EXPECT_EQ(orphan->images(), nullptr);
  EXPECT_EQ(orphan->childs(), nullptr);
}

TEST_F(KRDBAbstractBaseFolderTest, RelationsAreAskedOnceAndKept) {
  const auto parent = collection(9);
  context->parent = parent;
  context->images = {a};
  context->childs = {b, c};
  const EntitySetPtr images = folder->images();
  EXPECT_EQ(*images, KRDBEntitySet{a});
  EXPECT_EQ(folder->images(), images);
  EXPECT_EQ(folder->imagesPrimitive(), images);
  const EntitySetPtr childs = folder->childs();
  EXPECT_EQ(*childs, (KRDBEntitySet{b, c}));
  EXPECT_EQ(folder->childs(), childs);
  EXPECT_EQ(folder->parent(), parent);
  EXPECT_EQ(folder->parent(), parent);
  EXPECT_EQ(context->calls, (std::vector<std::string>{"imagesOfFilter", "childsOfFilter", "parentOfFilter"}));
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBAbstractBaseFolderTest, ANewParentPostsARelationChange) {
  const auto parent = collection(9);
  folder->setParent(parent);
  EXPECT_EQ(folder->parentPrimitive(), parent);
  expectOneRelationChange();
  folder->setParent(parent);
  EXPECT_TRUE(observer->events.empty());
  folder->setParentPrimitive(nullptr);
  EXPECT_EQ(folder->parentPrimitive(), nullptr);
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBAbstractBaseFolderTest, ImageSetsAreComparedByObject) {
  const EntitySetPtr images = setOf({a});
  folder->setImagesPrimitive(images);
  expectOneRelationChange();
  folder->setImagesPrimitive(images);
  EXPECT_TRUE(observer->events.empty());
  folder->setImagesPrimitive(setOf({a}));
  expectOneRelationChange();
}

TEST_F(KRDBAbstractBaseFolderTest, ChildSetsNotifyOnlyWhenAsked) {
  const EntitySetPtr first = setOf({a});
  folder->setSubfiltersPrimitive(first, false);
  EXPECT_EQ(folder->childsPrimitive(), first);
  EXPECT_TRUE(observer->events.empty());
  const EntitySetPtr second = setOf({b});
  folder->setSubfiltersPrimitive(second);
  expectOneRelationChange();
  folder->setSubfiltersPrimitive(second, true);
  EXPECT_TRUE(observer->events.empty());
  folder->setChildsPrimitive(first);
  EXPECT_EQ(folder->childsPrimitive(), first);
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBAbstractBaseFolderTest, AddingOnlyMembersChangesNothing) {
  const EntitySetPtr images = setOf({a, b});
  folder->setImagesPrimitive(images);
  observer->events.clear();
  EXPECT_TRUE(folder->addImagesPrimitive({a, b}).empty());
  EXPECT_EQ(folder->imagesPrimitive(), images);
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBAbstractBaseFolderTest, AddingAMixPostsOnceAndAnswersTheNewOnes) {
  folder->setImagesPrimitive(setOf({a}));
  observer->events.clear();
  EXPECT_EQ(folder->addImagesPrimitive({a, b, c}), (KRDBEntitySet{b, c}));
  EXPECT_EQ(*folder->imagesPrimitive(), (KRDBEntitySet{a, b, c}));
  expectOneRelationChange();
}

TEST_F(KRDBAbstractBaseFolderTest, AddingToNoSetMakesOne) {
  EXPECT_EQ(folder->addChildsPrimitive({a}), KRDBEntitySet{a});
  EXPECT_EQ(*folder->childsPrimitive(), KRDBEntitySet{a});
  expectOneRelationChange();
  EXPECT_TRUE(folder->addChildsPrimitive({a}).empty());
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBAbstractBaseFolderTest, DeletingAnswersTheRemovedMembers) {
  const EntitySetPtr images = setOf({a, b});
  folder->setImagesPrimitive(images);
  observer->events.clear();
  EXPECT_TRUE(folder->deleteImagesPrimitive({c}).empty());
  EXPECT_EQ(folder->imagesPrimitive(), images);
  EXPECT_TRUE(observer->events.empty());
  EXPECT_EQ(folder->deleteImagesPrimitive({b, c}), KRDBEntitySet{b});
  EXPECT_EQ(*folder->imagesPrimitive(), KRDBEntitySet{a});
  expectOneRelationChange();
}

TEST_F(KRDBAbstractBaseFolderTest, DeletingChildsPostsOnce) {
  folder->setSubfiltersPrimitive(setOf({a, b}), false);
  EXPECT_EQ(folder->deleteChildsPrimitive({a, b}), (KRDBEntitySet{a, b}));
  EXPECT_TRUE(folder->childsPrimitive()->empty());
  expectOneRelationChange();
  EXPECT_TRUE(folder->deleteChildsPrimitive({a}).empty());
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBAbstractBaseFolderTest, AddChildAsksTheContextWithASetOfOne) {
  const auto child = collection(5);
  folder->addChild(child);
  EXPECT_EQ(context->calls, std::vector<std::string>{"addChilds:toFilter:"});
  ASSERT_EQ(context->changedEntities.size(), 1u);
  EXPECT_EQ(context->changedEntities[0], KRDBEntitySet{child});
  EXPECT_EQ(context->changedFolders[0], folder);
  folder->addChilds({a, b});
  EXPECT_EQ(context->changedEntities[1], (KRDBEntitySet{a, b}));
}

TEST_F(KRDBAbstractBaseFolderTest, RelationsAreReachedByKey) {
  const auto parent = collection(9);
  folder->setValueForKey(KRValue(parent), "parentPrimitive");
  EXPECT_EQ(folder->valueForKey("parent").object(), parent);
  EXPECT_TRUE(folder->valueForKey("images").isNil());
  folder->setImagesPrimitive(setOf({a}));
  EXPECT_EQ(folder->valueForKey("images"), KRValue(KRSet({KRValue(a)})));
  folder->setSubfiltersPrimitive(setOf({b}), false);
  EXPECT_EQ(folder->valueForKey("childsPrimitive"), KRValue(KRSet({KRValue(b)})));
  EXPECT_TRUE(folder->valueForKey("attributes").isNil());
}

}  // namespace
