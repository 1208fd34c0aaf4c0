#include "Model/KRDBFilteredImageAttributesFetchRequest/KRDBFilteredImageAttributesFetchRequest.hpp"

#include <gtest/gtest.h>

#include "../KRDBFilteredEntitiesFetchRequest/KRFetchRequestCatalog.hpp"

namespace {

TEST(KRDBFilteredImageAttributesFetchRequestTest, TheUserAttributesNotMarkedToDeleteAreSelected) {
  const auto request = KRDBFilteredImageAttributesFetchRequest::init();
  EXPECT_EQ(request->entityType(), 5);
  EXPECT_EQ(request->selectQuery()->table(), "image_user_attributes");
  EXPECT_TRUE(std::dynamic_pointer_cast<dbcore::DBUserImgAttribSelectQuery>(request->selectQuery()));
  KRFetchRequestCatalog catalog;
  ASSERT_EQ(catalog.createImages(4).size(), 4u);
  catalog.markFirstToDelete<dbcore::DBUserImgAttrib>();
  catalog.expectSelectsEveryRecordNotMarkedToDelete<dbcore::DBUserImgAttrib>(*request);
}

}  // namespace
