#pragma once

#include <cstdint>

// The quick filter types a folder's view can select. Fixed numbers that catalogs and applications rely on:
// the exact-star types come last (23 to 26), after the unseen, seen and unedited types.
inline constexpr int64_t KRDBFilterTypeAllPhotos = 0;
inline constexpr int64_t KRDBFilterTypeFavorites = 1;
inline constexpr int64_t KRDBFilterTypeStarred5Stars = 2;
inline constexpr int64_t KRDBFilterTypeStarred4AndMoreStars = 3;
inline constexpr int64_t KRDBFilterTypeStarred3AndMoreStars = 4;
inline constexpr int64_t KRDBFilterTypeStarred2AndMoreStars = 5;
inline constexpr int64_t KRDBFilterTypeStarred1AndMoreStars = 6;
inline constexpr int64_t KRDBFilterTypeStarred0Stars = 7;
inline constexpr int64_t KRDBFilterTypeUnflagged = 8;
inline constexpr int64_t KRDBFilterTypeFlagged = 9;
inline constexpr int64_t KRDBFilterTypeRejected = 10;
inline constexpr int64_t KRDBFilterTypeLabeled = 11;
inline constexpr int64_t KRDBFilterTypeLabeledRed = 12;
inline constexpr int64_t KRDBFilterTypeLabeledYellow = 13;
inline constexpr int64_t KRDBFilterTypeLabeledGreen = 14;
inline constexpr int64_t KRDBFilterTypeLabeledBlue = 15;
inline constexpr int64_t KRDBFilterTypeLabeledPurple = 16;
inline constexpr int64_t KRDBFilterTypeLabeledNone = 17;
inline constexpr int64_t KRDBFilterTypeEdited = 18;
inline constexpr int64_t KRDBFilterTypeExported = 19;
inline constexpr int64_t KRDBFilterTypeUnseen = 20;
inline constexpr int64_t KRDBFilterTypeSeen = 21;
inline constexpr int64_t KRDBFilterTypeUnedited = 22;
inline constexpr int64_t KRDBFilterTypeStarred4Stars = 23;
inline constexpr int64_t KRDBFilterTypeStarred3Stars = 24;
inline constexpr int64_t KRDBFilterTypeStarred2Stars = 25;
inline constexpr int64_t KRDBFilterTypeStarred1Star = 26;
