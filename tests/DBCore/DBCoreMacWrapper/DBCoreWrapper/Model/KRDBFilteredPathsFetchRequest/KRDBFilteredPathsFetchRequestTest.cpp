#include "Model/KRDBFilteredPathsFetchRequest/KRDBFilteredPathsFetchRequest.hpp"

#include <gtest/gtest.h>

#include "../KRDBFilteredEntitiesFetchRequest/KRFetchRequestCatalog.hpp"

namespace {

TEST(KRDBFilteredPathsFetchRequestTest, PathsNotMarkedToDeleteAreSelectedByAPathQuery) {
  const auto request = KRDBFilteredPathsFetchRequest::init();
  EXPECT_EQ(request->entityType(), 4);
  EXPECT_TRUE(std::dynamic_pointer_cast<dbcore::DBPathSelectQuery>(request->selectQuery()));
  EXPECT_EQ(request->selectQuery()->table(), "paths");
  KRFetchRequestCatalog catalog;
  catalog.create(KRDBEntityTypePath,
                 {{{"DBPathInfoPath", "/a"}}, {{"DBPathInfoPath", "/a/b"}}, {{"DBPathInfoPath", "/c"}}});
  catalog.markFirstToDelete<dbcore::DBPath>();
  catalog.expectSelectsEveryRecordNotMarkedToDelete<dbcore::DBPath>(*request);
}

}  // namespace
