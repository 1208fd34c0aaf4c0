#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "KRContextGraphFixture.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesStorage.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"

namespace {

using ImagePtr = std::shared_ptr<KRDBImage>;
using CollectionPtr = std::shared_ptr<KRDBCollection>;

// Relations read through a context.
class KRDBContextRelationsTest : public KRContextGraphFixture {
 protected:
  static std::vector<int64_t> idsOf(const KRDBEntitySet& entities) {
    std::vector<int64_t> ids;
    for (const auto& entity : entities) ids.push_back(entity->entityID()->dbid());
    std::sort(ids.begin(), ids.end());
    return ids;
  }
  // Every entity of the set is the context's cached instance of its identifier.
  void expectCached(const KRDBEntitySet& entities) {
    for (const auto& entity : entities)
      EXPECT_EQ(context->cachedEntityForEntityID(entity->entityID()), entity);
  }
};

TEST_F(KRDBContextRelationsTest, TheRootCollectionHasNoParent) {
  EXPECT_FALSE(context->parentOfFilter(context->rootFilter()));
  EXPECT_FALSE(context->parentOfFilter(nullptr));
}

TEST_F(KRDBContextRelationsTest, AParentIsTheCachedInstance) {
  EXPECT_EQ(context->parentOfFilter(cached(child)), cached(first));
  EXPECT_EQ(context->parentOfFilter(cached(first)), context->rootFilter());
}

TEST_F(KRDBContextRelationsTest, ChildrenAreCachedInstances) {
  const KRDBEntitySet childs = context->childsOfFilter(context->rootFilter());
  EXPECT_TRUE(childs.contains(cached(first)));
  EXPECT_TRUE(childs.contains(cached(second)));
  expectCached(childs);
}

TEST_F(KRDBContextRelationsTest, ObtainingChildrenSetsTheChildrenAndTheirParent) {
  const auto parent = cached(first);
  KRDBEntitySet delivered;
  bool called = false;
  context->obtainChildsOfFilter(parent, [&](KRDBEntitySet childs) {
    delivered = std::move(childs);
    called = true;
  });
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return called; }));
  EXPECT_EQ(delivered, (KRDBEntitySet{cached(child)}));
  ASSERT_TRUE(parent->childsPrimitive());
  EXPECT_EQ(*parent->childsPrimitive(), delivered);
  EXPECT_EQ(cached(child)->parentPrimitive(), parent);
}

TEST_F(KRDBContextRelationsTest, ObtainingDescendantsGivesEveryLevel) {
  KRDBEntitySet delivered;
  bool called = false;
  context->obtainDescendantsOfFilter(context->rootFilter(), [&](KRDBEntitySet descendants) {
    delivered = std::move(descendants);
    called = true;
  });
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return called; }));
  EXPECT_TRUE(delivered.contains(cached(child)));
  EXPECT_TRUE(delivered.contains(cached(first)));
  expectCached(delivered);
}

TEST_F(KRDBContextRelationsTest, ImagesOfACollectionAndCollectionsOfAnImage) {
  const KRDBEntitySet members = context->imagesOfFilter(cached(first));
  EXPECT_EQ(idsOf(members),
            (std::vector<int64_t>{images[0]->entityID()->dbid(), images[1]->entityID()->dbid()}));
  expectCached(members);
  EXPECT_EQ(context->filtersOfImage(cached(images[0])), (KRDBEntitySet{cached(first)}));
  EXPECT_TRUE(context->filtersOfImage(cached(images[2])).empty());
}

TEST_F(KRDBContextRelationsTest, AttributeRecordsAndTheirImage) {
  const auto image = cached(images[1]);
  EXPECT_EQ(context->attributesForImage(image), image->attributesPrimitive());
  EXPECT_EQ(context->exivAttributesForImage(image), image->exivAttributesPrimitive());
  EXPECT_EQ(context->imageForAttributes(image->attributesPrimitive()), image);
  EXPECT_EQ(context->imageForExivAttributes(image->exivAttributesPrimitive()), image);
}

TEST_F(KRDBContextRelationsTest, FolderPathAndVolume) {
  const auto path = context->pathForReferencedFolder(cached(folder));
  ASSERT_TRUE(path);
  EXPECT_EQ(path->entityID()->dbid(), folders[0]->entityID()->dbid());
  EXPECT_EQ(path, cached(folders[0]));
  const auto volume = context->volumeForPath(path);
  ASSERT_TRUE(volume);
  EXPECT_EQ(context->cachedEntityForEntityID(volume->entityID()), volume);
}

TEST_F(KRDBContextRelationsTest, HistoryStatesOfAnImage) {
  const auto image = cached(images[2]);
  const KRDBImageStates states = context->statesForImage(image);
  ASSERT_EQ(states.size(), 1u);
  EXPECT_EQ(states[0], image->currentStatePrimitive());
  EXPECT_EQ(context->currentStateForImage(image), image->currentStatePrimitive());
}

TEST_F(KRDBContextRelationsTest, CurrentStatesOfEveryImageAreCachedInstances) {
  KRDBCatalog::ImageStatesByID delivered;
  bool called = false;
  context->obtainCurrentStatesForImages({}, [&](KRDBCatalog::ImageStatesByID states) {
    delivered = std::move(states);
    called = true;
  });
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return called; }));
  ASSERT_EQ(delivered.size(), images.size());
  for (const auto& image : images) {
    const auto state = delivered.at(image->entityID()->dbid());
    EXPECT_EQ(context->cachedEntityForEntityID(state->entityID()), state);
  }
}

TEST_F(KRDBContextRelationsTest, ANewFavoriteAliasIsAnAddedEntity) {
  const auto collection = cached(second);
  const auto alias = context->favoriteAliasForEntity(collection);
  ASSERT_TRUE(alias);
  EXPECT_TRUE(context->addedEntities().contains(alias));
  EXPECT_EQ(context->cachedEntityForEntityID(alias->entityID()), alias);
  context->addedEntities().clear();
  EXPECT_EQ(context->favoriteAliasForEntity(collection), alias);
  EXPECT_TRUE(context->addedEntities().empty());
}

}  // namespace
