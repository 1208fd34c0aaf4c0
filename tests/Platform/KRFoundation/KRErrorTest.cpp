#include "KRFoundation/KRError.hpp"

#include <gtest/gtest.h>

TEST(KRErrorTest, HoldsDomainCodeAndUserInfo) {
  auto error =
      KRError::errorWithDomain("KRCatalogErrorDomain", 1, {{KRError::NSLocalizedDescriptionKey, "Broken"}});
  EXPECT_EQ(error->domain(), KRString("KRCatalogErrorDomain"));
  EXPECT_EQ(error->code(), 1);
  EXPECT_EQ(error->localizedDescription(), KRString("Broken"));
  EXPECT_EQ(error->description(), "Error Domain=KRCatalogErrorDomain Code=1 \"Broken\"");
}

TEST(KRErrorTest, GenericDescriptionWithoutUserInfo) {
  auto error = KRError::errorWithDomain("D", -7);
  EXPECT_EQ(error->localizedDescription(),
            KRString("The operation couldn\u2019t be completed. (D error -7.)"));
}
