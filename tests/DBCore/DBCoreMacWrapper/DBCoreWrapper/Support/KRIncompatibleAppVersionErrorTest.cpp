#include "Support/KRIncompatibleAppVersionError.hpp"

#include <gtest/gtest.h>

#include <fstream>

#include "KRFoundation/KRJSON.hpp"
#include "KRServices/KRSLocalization.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

const char* const kDescriptionKey =
    "This catalog isn\u2019t compatible with\n<AppName>. Create a new catalog in\n<AppName> to continue.";
const char* const kGermanDescription =
    "Dieser Katalog ist nicht mit\n<AppName> kompatibel. Erstellen Sie einen neuen Katalog in\n<AppName>.";

// Removes the loaded localisation tables when made and when destroyed.
class LocalizationTablesGuard {
 public:
  LocalizationTablesGuard() { KRSLocalization::removeAllTables(); }
  ~LocalizationTablesGuard() { KRSLocalization::removeAllTables(); }
  LocalizationTablesGuard(const LocalizationTablesGuard&) = delete;
  LocalizationTablesGuard& operator=(const LocalizationTablesGuard&) = delete;
};

TEST(KRIncompatibleAppVersionErrorTest, DomainAndCodeConstants) {
  EXPECT_STREQ(KRCatalogErrorDomain, "KRCatalogErrorDomain");
  EXPECT_EQ(KRCatalogErrorIncompatibleAppVersion, 1);
}

TEST(KRIncompatibleAppVersionErrorTest, WithoutTablesTheDescriptionIsTheKey) {
  const LocalizationTablesGuard tables;
  const KRErrorPtr error = kr_incompatibleAppVersion();
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->domain(), KRString("KRCatalogErrorDomain"));
  EXPECT_EQ(error->code(), 1);
  EXPECT_EQ(error->userInfo().count(), 1u);
  EXPECT_EQ(error->userInfo().objectForKey(KRError::NSLocalizedDescriptionKey), KRValue(kDescriptionKey));
  EXPECT_EQ(error->localizedDescription(), KRString(kDescriptionKey));
}

TEST(KRIncompatibleAppVersionErrorTest, EachCallMakesANewError) {
  const LocalizationTablesGuard tables;
  EXPECT_NE(kr_incompatibleAppVersion(), kr_incompatibleAppVersion());
}

TEST(KRIncompatibleAppVersionErrorTest, LoadedTableTranslatesTheDescription) {
  const LocalizationTablesGuard tables;
  const KRTemporaryDirectory directory;
  const std::string path = directory.file("de.json");
  {
    std::ofstream file(path, std::ios::binary);
    file << KRJSON::stringWithJSONObject(KRDictionary{{kDescriptionKey, kGermanDescription}}).str();
  }
  ASSERT_TRUE(KRSLocalization::loadTableFromFile(path));
  const KRErrorPtr error = kr_incompatibleAppVersion();
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->domain(), KRString("KRCatalogErrorDomain"));
  EXPECT_EQ(error->code(), 1);
  EXPECT_EQ(error->userInfo().count(), 1u);
  EXPECT_EQ(error->userInfo().objectForKey(KRError::NSLocalizedDescriptionKey), KRValue(kGermanDescription));
}

}  // namespace
