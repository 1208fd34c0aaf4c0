#pragma once

#include <cstdint>

#include "dbreactor.hpp"

namespace reliability {

// The catalog identity the harnesses open files for, and the header values of docs/catalog-format.md.
inline constexpr dbcore::AppInfo kAppInfo = 5;
inline constexpr int32_t kApplicationIdBase = 0x4B524354;
inline constexpr int32_t kApplicationId = kApplicationIdBase ^ kAppInfo;
inline constexpr int kCurrentVersion = 121;
inline constexpr int kOldestVersion = 119;

}  // namespace reliability
