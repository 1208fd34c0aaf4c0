#include "Model/KRDBFilteredReffoldersFetchRequest/KRDBFilteredReffoldersFetchRequest.hpp"

#include <gtest/gtest.h>

#include "../KRDBFilteredEntitiesFetchRequest/KRFetchRequestCatalog.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"

namespace {

TEST(KRDBFilteredReffoldersFetchRequestTest, ReferencedFoldersNotMarkedToDeleteAreSelected) {
  const auto request = KRDBFilteredReffoldersFetchRequest::init();
  EXPECT_EQ(request->entityType(), 3);
  const auto query = request->selectQuery();
  EXPECT_TRUE(std::dynamic_pointer_cast<dbcore::DBEntityReffolderSelectQuery>(query));
  EXPECT_EQ(query->table(), "reffolders");
  KRFetchRequestCatalog catalog;
  for (const char* text : {"/photos", "/photos/2024", "/archive"}) {
    const auto paths = catalog.create(KRDBEntityTypePath, {{{"DBPathInfoPath", text}}});
    ASSERT_EQ(
        catalog.create(KRDBEntityTypeReferencedFolder, {{{"DBReferencedFolderPath", paths.at(0)}}}).size(),
        1u);
  }
  catalog.markFirstToDelete<dbcore::DBRefFolder>();
  catalog.expectSelectsEveryRecordNotMarkedToDelete<dbcore::DBRefFolder>(*request);
}

}  // namespace
