#include "Model/KRDBFilteredImageExivAttributesFetchRequest/KRDBFilteredImageExivAttributesFetchRequest.hpp"

#include <gtest/gtest.h>

#include "../KRDBFilteredEntitiesFetchRequest/KRFetchRequestCatalog.hpp"

namespace {

TEST(KRDBFilteredImageExivAttributesFetchRequestTest, TheExifAttributesNotMarkedToDeleteAreSelected) {
  KRFetchRequestCatalog catalog;
  ASSERT_EQ(catalog.createImages(2, true).size(), 2u);
  ASSERT_EQ(catalog.createImages(2).size(), 2u);
  catalog.markFirstToDelete<dbcore::DBExivImgAttrib>();
  const auto request = KRDBFilteredImageExivAttributesFetchRequest::init();
  catalog.expectSelectsEveryRecordNotMarkedToDelete<dbcore::DBExivImgAttrib>(*request);
  EXPECT_EQ(request->entityType(), 6);
  const auto query = request->selectQuery();
  EXPECT_EQ(query->table(), "image_exiv_attributes");
  EXPECT_TRUE(std::dynamic_pointer_cast<dbcore::DBExivImgAttribSelectQuery>(query));
}

}  // namespace
