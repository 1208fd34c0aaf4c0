#pragma once

#include <string>

namespace dbcore {

// Separates the selected filter types stored in one attribute string. It is the control character
// U+001F (unit separator), which no filter-type name contains.
extern const std::wstring kUserConditionsDelimiter;

// The condition kinds of a condition dictionary (smart-filter and fetch-request conditions): conditions
// on the image records, on their user attributes and on their exif attributes.
extern const std::wstring kImagesConditionKey;
extern const std::wstring kUserAttributesConditionKey;
extern const std::wstring kExivAttributesConditionKey;

}  // namespace dbcore
