#pragma once

#include <string>

namespace dbcore {

// Separates the selected filter types stored in one attribute string. It is the control character
// U+001F (unit separator), which no filter-type name contains.
inline const std::wstring kUserConditionsDelimiter = L"\u001F";

// The condition kinds of a condition dictionary (smart-filter and fetch-request conditions): conditions
// on the image records, on their user attributes and on their exif attributes.
// Defined in the header so that every file that includes it sees them initialised, also while other
// globals are being set up.
inline const std::wstring kImagesConditionKey = L"imageCondition";
inline const std::wstring kUserAttributesConditionKey = L"userAttributesCondition";
inline const std::wstring kExivAttributesConditionKey = L"exivAttributesCondition";

}  // namespace dbcore
