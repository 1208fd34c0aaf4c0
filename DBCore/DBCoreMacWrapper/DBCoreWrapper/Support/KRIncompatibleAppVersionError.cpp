#include "Support/KRIncompatibleAppVersionError.hpp"

#include "KRServices/KRSLocalization.hpp"

const char* const KRCatalogErrorDomain = "KRCatalogErrorDomain";

namespace {

const char* const kIncompatibleDescriptionKey =
    "This catalog isn\u2019t compatible with\n<AppName>. Create a new catalog in\n<AppName> to continue.";

}  // namespace

KRErrorPtr kr_incompatibleAppVersion() {
  const KRString description =
      KRSLocalization::localizedStringForKey(kIncompatibleDescriptionKey, KRString());
  return KRError::errorWithDomain(KRCatalogErrorDomain, KRCatalogErrorIncompatibleAppVersion,
                                  {{KRError::NSLocalizedDescriptionKey, description}});
}
