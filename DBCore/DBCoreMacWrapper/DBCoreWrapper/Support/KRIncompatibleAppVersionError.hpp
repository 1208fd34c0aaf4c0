#pragma once

#include "KRFoundation/KRError.hpp"

// The domain of the catalog's errors.
extern const char* const KRCatalogErrorDomain;
// The code of a catalog file that this version of the application cannot use.
inline constexpr long long KRCatalogErrorIncompatibleAppVersion = 1;

// The error of a catalog file that this version cannot open: domain KRCatalogErrorDomain, code 1, and
// the localised description of the incompatibility.
KRErrorPtr kr_incompatibleAppVersion();
