#include <gtest/gtest.h>

#include <map>
#include <memory>
#include <vector>

#include "KRContextGraphFixture.hpp"
#include "KRFoundation/KRUndoManager.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitesFilterUpdateProtocol.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesSubfilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBImagesFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBUnionEntitiesFilter.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"

namespace {

// Counts the change notifications of each filter.
class KRFilterChangeCounter : public KRObject, public KRDBEntitesFilterUpdateProtocol {
 public:
  void entitiesFilterDidChange(const std::shared_ptr<KRDBEntitiesFilter>& filter,
                               const KRDictionary&) override {
    ++changes[filter.get()];
  }
  std::map<const KRDBEntitiesFilter*, int> changes;
};

// Images marked to delete, with the context's undo manager, seen by three live filters: the images of a
// request sorted by id, a subfilter of them, and their union with a filter holding none of them. (A compound
// hears each member, so one over two members that both change announces twice in a pass.)
class KRDBContextUndoThroughFiltersTest : public KRContextGraphFixture {
 protected:
  void SetUp() override {
    KRContextGraphFixture::SetUp();
    context->setUndoManager(undoManager);
    const auto byID = std::make_shared<const KRSortDescriptors>(
        KRSortDescriptors{KRSortDescriptor::sortDescriptorWithKey("entityID.dbid", true)});
    // An image condition that every image meets: with one, the in-memory test also wants the image not
    // marked to delete (without any, it does not, as the engine's query always does).
    all = KRDBImagesFilter::initWithContext(context, requestWithCondition("import_index >= 0"));
    none = KRDBImagesFilter::initWithContext(context, requestWithCondition("import_index < 0"));
    all->setSortDescriptors(byID);
    subfilter = KRDBEntitiesSubfilter::initWithEntitiesFilter(all);
    subfilter->setPredicate(KRPredicate::predicateWithValue(true));
    united = KRDBUnionEntitiesFilter::initWithEntitiesFilters({all, none});
    united->setSortDescriptors(byID);
    obtain(none);
    filters = {all, subfilter, united};
    for (const auto& filter : filters) {
      obtain(filter);
      filter->addListener(counter);
    }
  }

  static std::shared_ptr<KRDBFilteredImagesFetchRequest> requestWithCondition(const char* condition) {
    const auto request = KRDBFilteredImagesFetchRequest::init();
    request->setFilterConditions({{"imageCondition", condition}});
    return request;
  }
  void obtain(const std::shared_ptr<KRDBEntitiesFilter>& filter) {
    bool done = false;
    filter->obtainSortedEntities([&done](const auto&) { done = true; });
    ASSERT_TRUE(KRContextCatalog::runUntil([&] { return done; }));
  }
  // Every filter holds the image (at the position) or none does; each was notified `times` since the last
  // check.
  void expectEverywhere(const std::shared_ptr<KRDBEntity>& image, bool held, uint64_t position, int times) {
    for (const auto& filter : filters) {
      EXPECT_EQ(filter->containsEntity(image), held);
      EXPECT_EQ(filter->indexOfEntity(image), held ? position : KRNotFound);
      EXPECT_EQ(counter->changes[filter.get()], times);
    }
    counter->changes.clear();
  }

  std::shared_ptr<KRUndoManager> undoManager = KRUndoManager::undoManager();
  std::shared_ptr<KRDBEntitiesFilter> all;
  std::shared_ptr<KRDBEntitiesSubfilter> subfilter;
  std::shared_ptr<KRDBEntitiesFilter> none;
  std::shared_ptr<KRDBUnionEntitiesFilter> united;
  std::vector<std::shared_ptr<KRDBEntitiesFilter>> filters;
  std::shared_ptr<KRFilterChangeCounter> counter = std::make_shared<KRFilterChangeCounter>();
};

}  // namespace

TEST_F(KRDBContextUndoThroughFiltersTest, UndoBringsAMarkedImageBackToItsPlaceAndRedoTakesItAway) {
  const auto image = images[1];
  const uint64_t position = all->indexOfEntity(image);
  ASSERT_NE(position, KRNotFound);
  context->markToRemoveEntities({image});
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return !context->isWaitingForProcessChanges(); }));
  expectEverywhere(image, false, 0, 1);
  undoManager->undo();
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return !context->isWaitingForProcessChanges(); }));
  EXPECT_FALSE(image->isMarkedToDelete());
  expectEverywhere(image, true, position, 1);
  undoManager->redo();
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return !context->isWaitingForProcessChanges(); }));
  EXPECT_TRUE(image->isMarkedToDelete());
  expectEverywhere(image, false, 0, 1);
}
