#include <gtest/gtest.h>

#include "DBReactorTestSupport.hpp"
#include "dbexception.hpp"

using namespace dbcore;

namespace {

class DBReactorRelationsTest : public DBReactorTestBase {
 protected:
  template <class T>
  static std::vector<long long> ids(const std::vector<std::shared_ptr<T>>& records) {
    std::vector<long long> result;
    for (const auto& record : records) result.push_back(record->id());
    return result;
  }

  std::shared_ptr<DBRefFolder> makeReferencedFolder(const std::wstring& path, long long parentId = 1) {
    auto folder = std::make_shared<DBRefFolder>();
    folder->uuid = L"uuid-" + path;
    auto record = std::make_shared<DBPath>();
    record->path = path;
    *reactor << DBind<DBRefFolder, long long, std::shared_ptr<DBPath>>(folder, parentId, record);
    return folder;
  }
};

}  // namespace

// ---- Trees

TEST_F(DBReactorRelationsTest, NewCollectionsGoUnderTheRootInOrder) {
  auto second = makeFilter(L"Second", 2);
  auto first = makeFilter(L"First", 1);
  auto tied = makeFilter(L"Tied", 2);
  auto root = reactor->GetRoot<DBFilter>();
  EXPECT_EQ(ids(reactor->Children(root)), (std::vector<long long>{first->id(), second->id(), tied->id()}));
  EXPECT_EQ(reactor->GetParent(first)->id(), root->id());
  EXPECT_EQ(reactor->GetParent(root), nullptr);
}

TEST_F(DBReactorRelationsTest, MoveAndDescendantsDepthFirst) {
  auto a = makeFilter(L"A", 1);
  auto b = makeFilter(L"B", 2);
  auto c = makeFilter(L"C", 3);
  ASSERT_TRUE(reactor->Move(c, a));
  ASSERT_TRUE(reactor->Move(b, a));
  auto root = reactor->GetRoot<DBFilter>();
  EXPECT_EQ(ids(reactor->Descendants(root)), (std::vector<long long>{a->id(), b->id(), c->id()}));
  EXPECT_EQ(ids(reactor->Children(a)), (std::vector<long long>{b->id(), c->id()}));
  EXPECT_EQ(reactor->GetParent(c)->id(), a->id());
}

TEST_F(DBReactorRelationsTest, MoveRefusesCyclesAndTheRoot) {
  auto a = makeFilter(L"A");
  auto b = makeFilter(L"B");
  ASSERT_TRUE(reactor->Move(b, a));
  EXPECT_FALSE(reactor->Move(a, b));
  EXPECT_FALSE(reactor->Move(a, a));
  EXPECT_FALSE(reactor->Move(reactor->GetRoot<DBFilter>(), a));
  EXPECT_EQ(reactor->GetParent(a)->id(), 1);
}

TEST_F(DBReactorRelationsTest, RemovingACollectionRemovesItsSubtreeButNeverTheRoot) {
  auto a = makeFilter(L"A");
  auto b = makeFilter(L"B");
  reactor->Move(b, a);
  EXPECT_TRUE(reactor->Remove(a));
  EXPECT_EQ(reactor->Get<DBFilter>(b->id()), nullptr);
  EXPECT_FALSE(reactor->Remove(reactor->GetRoot<DBFilter>()));
  EXPECT_TRUE(reactor->GetRoot<DBFilter>());
  EXPECT_FALSE(reactor->Remove(a));
}

TEST_F(DBReactorRelationsTest, SmartFiltersFormTheirOwnTree) {
  auto smart = std::make_shared<DBSmartFilter>();
  smart->name = L"Five stars";
  smart->filter_conditions = LR"({"userAttributesCondition":"rating == 5"})";
  *reactor << smart;
  EXPECT_TRUE(reactor->Children(smart).empty());
  EXPECT_EQ(reactor->Get<DBSmartFilter>(smart->id())->filter_conditions, smart->filter_conditions);
  auto attributes = std::make_shared<DBSmartFilterAttrib>();
  attributes->smart_filter_id = smart->id();
  std::shared_ptr<DBEntity> base = attributes;
  *reactor << base;
  EXPECT_EQ((reactor->GetAttributes<DBSmartFilterAttrib, DBSmartFilter>(smart)->id()), attributes->id());
}

TEST_F(DBReactorRelationsTest, ReferencedFolderBindingWritesFolderParentAndPath) {
  auto parent = makeReferencedFolder(L"/Photos");
  auto child = makeReferencedFolder(L"/Photos/2026", parent->id());
  EXPECT_EQ(reactor->GetParent(child)->id(), parent->id());
  auto path = reactor->Get<DBPath>(child->path_id);
  ASSERT_TRUE(path);
  EXPECT_EQ(path->path, L"/Photos/2026");
  EXPECT_EQ(ids(reactor->Children(reactor->GetRoot<DBRefFolder>())), (std::vector<long long>{parent->id()}));
}

TEST_F(DBReactorRelationsTest, ReferencedFolderTreeIsWrittenInOneStep) {
  auto pair = [](const std::wstring& path) {
    auto record = std::make_shared<DBPath>();
    record->path = path;
    return DBRefFolderPathPair{std::make_shared<DBRefFolder>(), record};
  };
  auto tree = std::make_shared<DBRefFolderTree>(pair(L"/Root"));
  auto a = tree->add_node(tree->root(), pair(L"/Root/a"));
  tree->add_node(a, pair(L"/Root/a/deep"));
  tree->add_node(tree->root(), pair(L"/Root/b"));
  *reactor << tree;
  auto root = tree->root()->folder();
  ASSERT_TRUE(root->is_saved());
  EXPECT_EQ(reactor->GetParent(root)->id(), 1);
  EXPECT_EQ(reactor->Descendants(root).size(), 3u);
  EXPECT_EQ(reactor->GetParent(a->folder())->id(), root->id());
}

TEST_F(DBReactorRelationsTest, TreeWithAnEmptyFolderWritesNothing) {
  auto tree =
      std::make_shared<DBRefFolderTree>(DBRefFolderPathPair{std::make_shared<DBRefFolder>(), nullptr});
  tree->add_node(tree->root(), DBRefFolderPathPair{nullptr, nullptr});
  EXPECT_THROW(*reactor << tree, DBException);
  EXPECT_TRUE(reactor->Children(reactor->GetRoot<DBRefFolder>()).empty());
}

// ---- Images in folders and collections

TEST_F(DBReactorRelationsTest, ImagesAreBoundToTheirFolder) {
  auto folder = makePath(L"/Photos");
  auto a = makeImage(L"a.jpg");
  auto b = makeImage(L"b.jpg");
  *reactor << std::vector<std::pair<std::shared_ptr<DBPath>, std::shared_ptr<DBImage>>>{{folder, a},
                                                                                        {folder, b}};
  EXPECT_EQ((reactor->GetBy<DBPath, DBImage>(a)->id()), folder->id());
  const auto byFolder = reactor->Connections<DBPath, DBImage>(false);
  EXPECT_EQ(byFolder.at(folder->id()), (std::set<long long>{a->id(), b->id()}));
  const auto byImage = reactor->Connections<DBPath, DBImage>(true);
  EXPECT_EQ(byImage.at(a->id()), (std::set<long long>{folder->id()}));
}

TEST_F(DBReactorRelationsTest, RebindMovesImagesToAnotherFolder) {
  auto first = makePath(L"/one");
  auto second = makePath(L"/two");
  auto image = makeImage(L"a.jpg");
  *reactor << std::vector<std::pair<std::shared_ptr<DBPath>, std::shared_ptr<DBImage>>>{{first, image}};
  reactor->RebindPathImages({{second->id(), image}});
  EXPECT_EQ((reactor->GetBy<DBPath, DBImage>(image)->id()), second->id());
}

TEST_F(DBReactorRelationsTest, VolumeOfAFolder) {
  auto volume = std::make_shared<DBVolume>();
  volume->uuid = L"DISK-1";
  *reactor << volume;
  auto path = makePath(L"/Photos");
  EXPECT_EQ((reactor->GetBy<DBVolume, DBPath>(path)), nullptr);
  EXPECT_TRUE((reactor->Bind<DBPath, DBVolume>(path, volume)));
  EXPECT_EQ((reactor->GetBy<DBVolume, DBPath>(reactor->Get<DBPath>(path->id()))->uuid), L"DISK-1");
  EXPECT_THROW((reactor->Bind<DBPath, DBVolume>(path, std::make_shared<DBVolume>())), DBException);
}

TEST_F(DBReactorRelationsTest, CollectionMembership) {
  auto trips = makeFilter(L"Trips");
  auto best = makeFilter(L"Best");
  auto image = makeImage(L"a.jpg");
  reactor->FilterAddImage(trips->id(), image);
  reactor->FilterAddImage(trips->id(), image);
  reactor->FilterAddImage(best->id(), image);
  EXPECT_EQ(ids(reactor->GetFiltersByImage(image->id(), -1, -1)),
            (std::vector<long long>{trips->id(), best->id()}));
  EXPECT_EQ(ids(reactor->GetFiltersByImage(image->id(), 1, 1)), (std::vector<long long>{best->id()}));
  reactor->FilterDelImage(trips->id(), image);
  reactor->FilterDelImage(trips->id(), image);
  EXPECT_EQ(ids(reactor->GetFiltersByImage(image->id(), -1, -1)), (std::vector<long long>{best->id()}));
}

TEST_F(DBReactorRelationsTest, ReferencedFolderMembershipIsRemovedWithTheImage) {
  auto folder = makeReferencedFolder(L"/Photos");
  auto image = makeImage(L"a.jpg");
  EXPECT_TRUE((reactor->Bind<DBRefFolder, DBImage>(folder, image)));
  EXPECT_TRUE((reactor->Bind<DBRefFolder, DBImage>(folder, image)));
  EXPECT_TRUE(reactor->Remove(image));
  EXPECT_FALSE(reactor->Remove(image));
}

TEST_F(DBReactorRelationsTest, RemovingAnImageRemovesItsAttributesAndMemberships) {
  auto image = makeImage(L"a.jpg");
  auto attributes = reactor->GetBy<DBUserImgAttrib, DBImage>(image);
  *reactor << std::vector<std::shared_ptr<DBUserImgAttrib>>{attributes};
  auto collection = makeFilter(L"Trips");
  reactor->FilterAddImage(collection->id(), image);
  reactor->Remove(std::vector<std::shared_ptr<DBImage>>{image});
  EXPECT_EQ(reactor->Get<DBUserImgAttrib>(attributes->id()), nullptr);
  EXPECT_TRUE(reactor->GetFiltersByImage(image->id(), -1, -1).empty());
  EXPECT_EQ(reactor->Count<DBImage>(), 0u);
}

TEST_F(DBReactorRelationsTest, RemovingAttributesAndAliases) {
  auto image = makeImage(L"a.jpg");
  auto attributes = reactor->GetBy<DBUserImgAttrib, DBImage>(image);
  *reactor << std::vector<std::shared_ptr<DBUserImgAttrib>>{attributes};
  EXPECT_TRUE(reactor->Remove(attributes));
  auto alias = std::make_shared<DBEntityFavoriteAlias>();
  alias->orig_type = kDBImageType;
  alias->orig_id = image->id();
  *reactor << alias;
  EXPECT_TRUE(reactor->Remove(alias));
  EXPECT_FALSE(reactor->Remove(alias));
}

// ---- Paths

TEST_F(DBReactorRelationsTest, RenamePathRenamesTheFolderAndEverythingBelow) {
  auto volume = std::make_shared<DBVolume>();
  *reactor << volume;
  auto other = std::make_shared<DBVolume>();
  *reactor << other;
  auto top = makePath(L"/Photos/Trip", volume->id());
  auto below = makePath(L"/Photos/Trip/Day 1", volume->id());
  auto sibling = makePath(L"/Photos/Trips", volume->id());
  auto elsewhere = makePath(L"/Photos/Trip", other->id());
  EXPECT_TRUE(reactor->RenamePath(L"/Photos/Trip/", L"/Archive/Trip", volume, other));
  EXPECT_EQ(reactor->Get<DBPath>(top->id())->path, L"/Archive/Trip");
  EXPECT_EQ(reactor->Get<DBPath>(below->id())->path, L"/Archive/Trip/Day 1");
  EXPECT_EQ(reactor->Get<DBPath>(below->id())->volume_id, other->id());
  EXPECT_EQ(reactor->Get<DBPath>(sibling->id())->path, L"/Photos/Trips");
  EXPECT_EQ(reactor->Get<DBPath>(elsewhere->id())->path, L"/Photos/Trip");
  EXPECT_FALSE(reactor->RenamePath(L"/Nowhere", L"/Else", volume, volume));
}

TEST_F(DBReactorRelationsTest, RenamePathTreatsWildcardsLiterally) {
  auto percent = makePath(L"/100%");
  auto other = makePath(L"/100x/inner");
  EXPECT_TRUE(reactor->RenamePath(L"/100%", L"/done", nullptr, nullptr));
  EXPECT_EQ(reactor->Get<DBPath>(percent->id())->path, L"/done");
  EXPECT_EQ(reactor->Get<DBPath>(other->id())->path, L"/100x/inner");
}

// ---- History states

TEST_F(DBReactorRelationsTest, StatesByVectorAndCurrentState) {
  auto image = makeImage(L"a.jpg");
  std::vector<std::shared_ptr<DBImgHistoryState>> states;
  for (int i = 0; i < 3; ++i) {
    states.push_back(std::make_shared<DBImgHistoryState>());
    states.back()->action_name = L"step " + std::to_wstring(i);
  }
  EXPECT_EQ((reactor->GetCurrentState<DBImage, DBImgHistoryState>(image)), nullptr);
  reactor->SetStatesByVector<DBImage, DBImgHistoryState>({{image, {states, 1}}});
  EXPECT_EQ(ids(reactor->GetStates<DBImage, DBImgHistoryState>(image)), ids(states));
  EXPECT_EQ((reactor->GetCurrentState<DBImage, DBImgHistoryState>(image)->id()), states[1]->id());
  reactor->SetCurrentState<DBImage, DBImgHistoryState>(image, states[2]);
  const auto current = reactor->GetCurrentStates<DBImage, DBImgHistoryState>({image, makeImage(L"b.jpg")});
  ASSERT_EQ(current.size(), 1u);
  EXPECT_EQ(current.at(image->id())->id(), states[2]->id());
  const auto every = reactor->GetCurrentStates<DBImage, DBImgHistoryState>({});
  ASSERT_EQ(every.size(), 1u);
  EXPECT_EQ(every.at(image->id())->id(), states[2]->id());
}

TEST_F(DBReactorRelationsTest, SettingACurrentStateOutsideTheListAppendsIt) {
  auto image = makeImage(L"a.jpg");
  auto first = std::make_shared<DBImgHistoryState>();
  reactor->SetStatesByVector<DBImage, DBImgHistoryState>({{image, {{first}, -1}}});
  EXPECT_EQ((reactor->GetCurrentState<DBImage, DBImgHistoryState>(image)), nullptr);
  auto extra = std::make_shared<DBImgHistoryState>();
  reactor->SetCurrentState<DBImage, DBImgHistoryState>(image, extra);
  EXPECT_EQ(ids(reactor->GetStates<DBImage, DBImgHistoryState>(image)),
            (std::vector<long long>{first->id(), extra->id()}));
  reactor->SetCurrentState<DBImage, DBImgHistoryState>(image, nullptr);
  EXPECT_EQ((reactor->GetCurrentState<DBImage, DBImgHistoryState>(image)), nullptr);
}

TEST_F(DBReactorRelationsTest, DanglingStatesAndResources) {
  auto image = makeImage(L"a.jpg");
  auto kept = std::make_shared<DBImgHistoryState>();
  kept->guid = L"kept";
  auto loose = std::make_shared<DBImgHistoryState>();
  loose->guid = L"loose";
  *reactor << loose;
  reactor->SetStatesByVector<DBImage, DBImgHistoryState>({{image, {{kept}, 0}}});
  reactor->BindStateWithResources(kept, {L"edit.xmp", L"mask.png"});
  auto derived = std::make_shared<DBImgHistoryState>();
  *reactor << derived;
  reactor->BindStateWithResourcesFromBaseStateID(derived, kept->id());
  const auto dangling = reactor->GetDanglingHistoryStates();
  ASSERT_EQ(dangling.size(), 2u);
  EXPECT_EQ(dangling[0]->guid, L"loose");
  EXPECT_TRUE(reactor->GetDangling<DBResource>().empty());
  reactor->ClearDanglingHistoryStates();
  EXPECT_TRUE(reactor->GetDanglingHistoryStates().empty());
  EXPECT_TRUE(reactor->GetDangling<DBResource>().empty());  // the kept state still uses both
  reactor->Remove(image);
  reactor->ClearDanglingHistoryStates();
  const auto resources = reactor->GetDangling<DBResource>();
  ASSERT_EQ(resources.size(), 2u);
  EXPECT_EQ(resources[0]->name, L"edit.xmp");
  reactor->ClearDangling<DBResource>();
  EXPECT_TRUE(reactor->GetDangling<DBResource>().empty());
}

TEST_F(DBReactorRelationsTest, DanglingPathsAreThoseWithoutImagesOrFolders) {
  auto used = makePath(L"/used");
  auto unused = makePath(L"/unused");
  auto folder = makeReferencedFolder(L"/referenced");
  *reactor << std::vector<std::pair<std::shared_ptr<DBPath>, std::shared_ptr<DBImage>>>{
      {used, makeImage(L"a.jpg")}};
  reactor->ClearDanglingPaths();
  EXPECT_TRUE(reactor->Get<DBPath>(used->id()));
  EXPECT_EQ(reactor->Get<DBPath>(unused->id()), nullptr);
  EXPECT_TRUE(reactor->Get<DBPath>(folder->path_id));
}

TEST_F(DBReactorRelationsTest, EmptyRecordsAreRefused) {
  EXPECT_THROW(reactor->FilterAddImage(1, nullptr), DBException);
  EXPECT_THROW(reactor->Remove(std::shared_ptr<DBImage>()), DBException);
  EXPECT_THROW(*reactor << std::shared_ptr<DBImage>(), DBException);
  EXPECT_TRUE(reactor->Children(std::shared_ptr<DBFilter>()).empty());
  EXPECT_EQ(reactor->GetParent(std::shared_ptr<DBRefFolder>()), nullptr);
}
