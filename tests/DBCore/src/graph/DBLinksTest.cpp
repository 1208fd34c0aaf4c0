#include "dblinks.hpp"

#include <gtest/gtest.h>

#include <map>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "DBConnectionTestSupport.hpp"
#include "dbrecords.hpp"
#include "dbtree.hpp"

using namespace dbcore;

namespace {

using Connections = std::map<long long, std::set<long long>>;

class DBLinksTest : public DBCatalogTestBase {
 protected:
  long long image() { return saved(DBImage())->id(); }

  long long path(const std::wstring& text, int64_t volumeId = 1) {
    DBPath record;
    record.path = text;
    record.volume_id = volumeId;
    return saved(record)->id();
  }

  // The stored path and volume of a path record.
  std::pair<std::wstring, int64_t> storedPath(long long id) {
    const auto record = DBRecordIO::get<DBPath>(*connection, id);
    return record ? std::make_pair(record->path, record->volume_id)
                  : std::make_pair(std::wstring(L"?"), int64_t{-1});
  }

  std::set<long long> filterMembers(long long filterId) {
    return queryIds("SELECT image_id FROM filter_images WHERE filter_id = " + std::to_string(filterId));
  }

  long long alias(uint8_t type, int64_t id) {
    DBEntityFavoriteAlias record;
    record.orig_type = type;
    record.orig_id = id;
    return saved(record)->id();
  }
};

}  // namespace

TEST_F(DBLinksTest, SetFolderBindsAndZeroUnbinds) {
  const long long photo = image();
  const long long folder = path(L"Photos");
  DBLinks::setFolder(*connection, photo, folder);
  EXPECT_EQ(queryIds("SELECT folder_path_id FROM images"), (std::set<long long>{folder}));
  DBLinks::setFolder(*connection, photo, 0);
  EXPECT_EQ(connection->queryInt64("SELECT folder_path_id IS NULL FROM images"), 1);
}

TEST_F(DBLinksTest, AddMemberIsIdempotentAndRemoveMemberRemovesOnlyThatPair) {
  const long long a = image();
  const long long b = image();
  DBLinks::addMember(*connection, DBLinks::kFilterImages, DBTree::kRootId, a);
  DBLinks::addMember(*connection, DBLinks::kFilterImages, DBTree::kRootId, a);
  DBLinks::addMember(*connection, DBLinks::kFilterImages, DBTree::kRootId, b);
  EXPECT_EQ(filterMembers(DBTree::kRootId), (std::set<long long>{a, b}));
  DBLinks::removeMember(*connection, DBLinks::kFilterImages, DBTree::kRootId, a);
  EXPECT_EQ(filterMembers(DBTree::kRootId), (std::set<long long>{b}));
}

TEST_F(DBLinksTest, ReferencedFolderMembersGoToTheirOwnTable) {
  const long long a = image();
  DBLinks::addMember(*connection, DBLinks::kReferencedFolderImages, DBTree::kRootId, a);
  EXPECT_EQ(queryIds("SELECT image_id FROM referenced_folder_images WHERE ref_folder_id = 1"),
            (std::set<long long>{a}));
  EXPECT_TRUE(filterMembers(DBTree::kRootId).empty());
  DBLinks::removeMember(*connection, DBLinks::kReferencedFolderImages, DBTree::kRootId, a);
  EXPECT_EQ(connection->queryInt64("SELECT count(*) FROM referenced_folder_images"), 0);
}

TEST_F(DBLinksTest, FolderConnectionsInBothDirections) {
  const long long p = path(L"p");
  const long long q = path(L"q");
  const long long a = image();
  const long long b = image();
  const long long c = image();
  image();  // in no folder
  DBLinks::setFolder(*connection, a, p);
  DBLinks::setFolder(*connection, b, p);
  DBLinks::setFolder(*connection, c, q);
  EXPECT_EQ(DBLinks::folderConnections(*connection, false), (Connections{{p, {a, b}}, {q, {c}}}));
  EXPECT_EQ(DBLinks::folderConnections(*connection, true), (Connections{{a, {p}}, {b, {p}}, {c, {q}}}));
}

TEST_F(DBLinksTest, RenameMovesTheFolderAndEveryPathBelowToTheNewVolume) {
  const long long top = path(L"Photos");
  const long long below = path(L"Photos/2024/Jan");
  const long long sameStart = path(L"PhotosOld");
  EXPECT_TRUE(DBLinks::renamePaths(*connection, L"Photos", L"Pictures", 1, 2));
  EXPECT_EQ(storedPath(top), std::make_pair(std::wstring(L"Pictures"), int64_t{2}));
  EXPECT_EQ(storedPath(below), std::make_pair(std::wstring(L"Pictures/2024/Jan"), int64_t{2}));
  EXPECT_EQ(storedPath(sameStart), std::make_pair(std::wstring(L"PhotosOld"), int64_t{1}));
}

TEST_F(DBLinksTest, RenameIgnoresTrailingSeparators) {
  const long long top = path(L"Photos");
  const long long below = path(L"Photos/2024");
  EXPECT_TRUE(DBLinks::renamePaths(*connection, L"Photos/", L"Pictures//", 1, 1));
  EXPECT_EQ(storedPath(top).first, L"Pictures");
  EXPECT_EQ(storedPath(below).first, L"Pictures/2024");
}

TEST_F(DBLinksTest, RenameTakesPercentAndUnderscoreLiterally) {
  const long long underscore = path(L"a_b/c");
  const long long lookalike = path(L"axb/c");
  const long long percent = path(L"100%/d");
  const long long digits = path(L"1000/d");
  EXPECT_TRUE(DBLinks::renamePaths(*connection, L"a_b", L"z", 1, 1));
  EXPECT_TRUE(DBLinks::renamePaths(*connection, L"100%", L"w", 1, 1));
  EXPECT_EQ(storedPath(underscore).first, L"z/c");
  EXPECT_EQ(storedPath(lookalike).first, L"axb/c");
  EXPECT_EQ(storedPath(percent).first, L"w/d");
  EXPECT_EQ(storedPath(digits).first, L"1000/d");
}

TEST_F(DBLinksTest, RenameCountsCharactersOfWideText) {
  const long long below = path(L"\u00c9t\u00e9 \U0001F600/\u65e5\u672c");
  EXPECT_TRUE(DBLinks::renamePaths(*connection, L"\u00c9t\u00e9 \U0001F600", L"Summer", 1, 1));
  EXPECT_EQ(storedPath(below).first, L"Summer/\u65e5\u672c");
}

TEST_F(DBLinksTest, RenameLeavesOtherVolumesUntouched) {
  const long long elsewhere = path(L"Photos/2024", 3);
  EXPECT_FALSE(DBLinks::renamePaths(*connection, L"Photos", L"Pictures", 1, 2));
  EXPECT_EQ(storedPath(elsewhere), std::make_pair(std::wstring(L"Photos/2024"), int64_t{3}));
}

TEST_F(DBLinksTest, RemoveFavoriteAliasRemovesOnlyTheAliasOfThatRecord) {
  DBImage photo;
  photo.set_id(5);
  alias(kDBImageType, 5);
  const long long kept = alias(kDBFilterType, 5);
  DBLinks::removeFavoriteAlias(*connection, photo);
  EXPECT_EQ(queryIds(std::string("SELECT _id_int_64 FROM ") + DBEntityFavoriteAlias::kTableName),
            (std::set<long long>{kept}));
}
