#include "dbimgselectquery.hpp"

#include <gtest/gtest.h>

#include <map>

#include "DBSelectQueryTestSupport.hpp"
#include "dbselectplan.hpp"

using namespace dbcore;

namespace {

using Ids = std::vector<long long>;

class DBImgSelectQueryTest : public DBSelectQueryTestBase {
 protected:
  std::shared_ptr<DBVolume> makeVolume() {
    auto volume = std::make_shared<DBVolume>();
    *reactor << volume;
    return volume;
  }

  std::shared_ptr<DBImage> imageIn(const std::shared_ptr<DBPath>& folder, const std::wstring& name) {
    auto image = makeImage(name);
    *reactor << std::vector<std::pair<std::shared_ptr<DBPath>, std::shared_ptr<DBImage>>>{{folder, image}};
    return image;
  }

  std::shared_ptr<DBUserImgAttrib> rate(const std::shared_ptr<DBImage>& image, int32_t rating) {
    auto attributes = std::make_shared<DBUserImgAttrib>();
    attributes->image_id = image->id();
    attributes->rating = rating;
    *reactor << std::vector<std::shared_ptr<DBUserImgAttrib>>{attributes};
    user[image->id()] = attributes;
    return attributes;
  }

  std::shared_ptr<DBExivImgAttrib> shoot(const std::shared_ptr<DBImage>& image, const std::wstring& model) {
    auto attributes = std::make_shared<DBExivImgAttrib>();
    attributes->image_id = image->id();
    attributes->camera_model = model;
    *reactor << std::vector<std::shared_ptr<DBExivImgAttrib>>{attributes};
    exif[image->id()] = attributes;
    return attributes;
  }

  std::shared_ptr<DBImgSelectQuery> queryWithResolver() {
    auto query = std::make_shared<DBImgSelectQuery>();
    query->setRelatedRecordResolver([this](const DBEntity& record, const std::string& table) {
      const auto& records = table == DBUserImgAttrib::kTableName ? user : exif;
      const auto found = records.find(record.id());
      return found == records.end() ? nullptr : found->second;
    });
    return query;
  }

  Ids folderTreeIds(const std::shared_ptr<DBPath>& folder) {
    auto query = std::make_shared<DBImgSelectQuery>();
    query->PathPrefix(folder);
    return selectedIds<DBImage>(query);
  }

  std::map<long long, std::shared_ptr<DBEntity>> user;
  std::map<long long, std::shared_ptr<DBEntity>> exif;
};

}  // namespace

TEST_F(DBImgSelectQueryTest, WhereOverImageColumns) {
  const auto a = makeImage(L"a.jpg");
  const auto b = makeImage(L"b.jpg");
  b->set_marked_to_delete(true);
  *reactor << b;
  auto query = std::make_shared<DBImgSelectQuery>();
  query->Where(where<DBImage>("(marked_to_delete_bool == false)"));
  EXPECT_EQ(selectedIds<DBImage>(query), Ids{a->id()});
  EXPECT_EQ(satisfyingIds(query, std::vector<std::shared_ptr<DBImage>>{a, b}), Ids{a->id()});
}

TEST_F(DBImgSelectQueryTest, FiltersSelectImagesOfAnyOfTheCollections) {
  const auto a = makeImage(L"a");
  const auto b = makeImage(L"b");
  const auto c = makeImage(L"c");
  const auto first = makeFilter(L"first");
  const auto second = makeFilter(L"second");
  reactor->FilterAddImage(first->id(), a);
  reactor->FilterAddImage(second->id(), b);
  reactor->FilterAddImage(second->id(), a);
  auto query = std::make_shared<DBImgSelectQuery>();
  query->Filters({second->id(), first->id(), second->id()});
  EXPECT_EQ(selectedIds<DBImage>(query), (Ids{a->id(), b->id()}));
  query->Filters({first->id()});
  EXPECT_EQ(selectedIds<DBImage>(query), Ids{a->id()});
  query->Filters({9999});
  EXPECT_TRUE(selectedIds<DBImage>(query).empty());
  query->Filters({});
  EXPECT_EQ(selectedIds<DBImage>(query), (Ids{a->id(), b->id(), c->id()}));
}

TEST_F(DBImgSelectQueryTest, PathPrefixCoversTheFolderAndBelowOnItsVolume) {
  const auto volume = makeVolume();
  const auto otherVolume = makeVolume();
  const auto folder = makePath(L"/a/b", volume->id());
  const auto inFolder = imageIn(folder, L"1");
  const auto below = imageIn(makePath(L"/a/b/c/d", volume->id()), L"2");
  const auto sibling = imageIn(makePath(L"/a/bc", volume->id()), L"3");
  const auto parent = imageIn(makePath(L"/a", volume->id()), L"4");
  const auto elsewhere = imageIn(makePath(L"/a/b", otherVolume->id()), L"5");
  makeImage(L"no folder");
  EXPECT_EQ(folderTreeIds(folder), (Ids{inFolder->id(), below->id()}));
  // Trailing separators are ignored.
  EXPECT_EQ(folderTreeIds(makePath(L"/a/b//", volume->id())), (Ids{inFolder->id(), below->id()}));
  // An empty path covers its whole volume.
  EXPECT_EQ(folderTreeIds(makePath(L"", volume->id())),
            (Ids{inFolder->id(), below->id(), sibling->id(), parent->id()}));
  EXPECT_EQ(folderTreeIds(makePath(L"/", otherVolume->id())), Ids{elsewhere->id()});
}

TEST_F(DBImgSelectQueryTest, PathPrefixTakesNonAsciiAndLikeCharactersLiterally) {
  const auto volume = makeVolume();
  const auto folder = makePath(L"/F\u00f6to_%", volume->id());
  const auto inside = imageIn(makePath(L"/F\u00f6to_%/\u65e5", volume->id()), L"1");
  imageIn(makePath(L"/F\u00f6toX%/a", volume->id()), L"2");
  imageIn(makePath(L"/F\u00f6to_%0", volume->id()), L"3");
  EXPECT_EQ(folderTreeIds(folder), Ids{inside->id()});
}

TEST_F(DBImgSelectQueryTest, EmptyPathPointerRestrictsNothing) {
  const auto a = makeImage(L"a");
  auto query = std::make_shared<DBImgSelectQuery>();
  query->PathPrefix(makePath(L"/x"));
  EXPECT_TRUE(selectedIds<DBImage>(query).empty());
  query->PathPrefix(nullptr);
  EXPECT_EQ(selectedIds<DBImage>(query), Ids{a->id()});
}

TEST_F(DBImgSelectQueryTest, JoinsConditionTheAttributeRecords) {
  const auto good = makeImage(L"good");
  const auto bad = makeImage(L"bad");
  const auto unrated = makeImage(L"unrated");
  const auto otherCamera = makeImage(L"other camera");
  rate(good, 4);
  rate(bad, 1);
  rate(otherCamera, 5);
  for (const auto& image : {good, bad, unrated}) shoot(image, L"X-T5");
  shoot(otherCamera, L"A7");
  const std::vector<std::shared_ptr<DBImage>> all{good, bad, unrated, otherCamera};
  auto query = queryWithResolver();
  query->Join<DBUserImgAttrib>(joined<DBUserImgAttrib>("rating >= 3"));
  EXPECT_EQ(selectedIds<DBImage>(query), (Ids{good->id(), otherCamera->id()}));
  EXPECT_EQ(satisfyingIds(query, all), (Ids{good->id(), otherCamera->id()}));
  query->Join<DBExivImgAttrib>(joined<DBExivImgAttrib>("camera_model_wide_ch == 'X-T5'"));
  EXPECT_EQ(selectedIds<DBImage>(query), Ids{good->id()});
  EXPECT_EQ(satisfyingIds(query, all), Ids{good->id()});
  // A join with a condition that every record passes still needs the record.
  query->Join<DBUserImgAttrib>(joined<DBUserImgAttrib>("rating >= 0"));
  EXPECT_EQ(selectedIds<DBImage>(query), (Ids{good->id(), bad->id()}));
  EXPECT_EQ(satisfyingIds(query, all), (Ids{good->id(), bad->id()}));
  // An empty clause removes the join.
  query->Join<DBUserImgAttrib>(std::make_shared<DBClause>());
  EXPECT_EQ(selectedIds<DBImage>(query), (Ids{good->id(), bad->id(), unrated->id()}));
  EXPECT_EQ(satisfyingIds(query, all), (Ids{good->id(), bad->id(), unrated->id()}));
}

TEST_F(DBImgSelectQueryTest, WithoutResolverJoinedQueriesAreNotSatisfied) {
  const auto image = makeImage(L"a");
  rate(image, 5);
  auto query = std::make_shared<DBImgSelectQuery>();
  query->Join<DBUserImgAttrib>(joined<DBUserImgAttrib>("rating == 5"));
  EXPECT_EQ(selectedIds<DBImage>(query), Ids{image->id()});
  EXPECT_TRUE(satisfyingIds(query, std::vector<std::shared_ptr<DBImage>>{image}).empty());
}

TEST_F(DBImgSelectQueryTest, EverythingTogether) {
  const auto volume = makeVolume();
  const auto folder = makePath(L"/photos", volume->id());
  const auto collection = makeFilter(L"picks");
  const auto match = imageIn(folder, L"match");
  const auto notInCollection = imageIn(folder, L"not in collection");
  const auto lowRating = imageIn(folder, L"low rating");
  const auto outside = imageIn(makePath(L"/other", volume->id()), L"outside");
  for (const auto& image : {match, notInCollection, lowRating, outside}) {
    rate(image, image == lowRating ? 1 : 5);
    reactor->FilterAddImage(collection->id(), image);
  }
  reactor->FilterDelImage(collection->id(), notInCollection);
  auto query = queryWithResolver();
  query->Where(where<DBImage>("(marked_to_delete_bool == false) && (path_wide_ch != 'x')"));
  query->Filters({collection->id()});
  query->PathPrefix(folder);
  query->Join<DBUserImgAttrib>(joined<DBUserImgAttrib>("rating >= 3"));
  EXPECT_EQ(selectedIds<DBImage>(query), Ids{match->id()});
  // Result covers the clauses only: collections and folders are the object layer's to test.
  EXPECT_EQ(
      satisfyingIds(query, std::vector<std::shared_ptr<DBImage>>{match, notInCollection, lowRating, outside}),
      (Ids{match->id(), notInCollection->id(), outside->id()}));
}

TEST_F(DBImgSelectQueryTest, InjectionAttemptsAreOnlyValues) {
  const auto plain = makeImage(L"plain");
  const auto quoted = makeImage(L"it's");
  const std::vector<std::string> attempts = {
      "path_wide_ch == 'x\\' OR 1=1 --'", "path_wide_ch == 'x\\'; DROP TABLE images; --'",
      "path_wide_ch == '/* comment */'",  "path_wide_ch == \"') OR ('1'='1\"",
      "guid_wide_ch == path_wide_ch",     "path_wide_ch == camera_model_wide_ch"};
  for (const std::string& condition : attempts) {
    auto query = std::make_shared<DBImgSelectQuery>();
    query->Where(where<DBImage>(condition));
    const std::string sql = query->planFor("images")->tail();
    for (const char* fragment : {"OR 1", "DROP", "--", "/*", "'", "camera_model"}) {
      EXPECT_EQ(sql.find(fragment), std::string::npos) << condition << "\n" << sql;
    }
    EXPECT_TRUE(selectedIds<DBImage>(query).empty()) << condition;
  }
  auto query = std::make_shared<DBImgSelectQuery>();
  query->Where(where<DBImage>("path_wide_ch == 'it\\'s'"));
  EXPECT_EQ(selectedIds<DBImage>(query), Ids{quoted->id()});
  EXPECT_EQ(reactor->Count<DBImage>(), 2u);
  EXPECT_NE(reactor->Get<DBImage>(plain->id()), nullptr);
}
