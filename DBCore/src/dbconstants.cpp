#include "dbconstants.hpp"

namespace dbcore {

const std::wstring kUserConditionsDelimiter = L"\u001F";

const std::wstring kImagesConditionKey = L"imageCondition";
const std::wstring kUserAttributesConditionKey = L"userAttributesCondition";
const std::wstring kExivAttributesConditionKey = L"exivAttributesCondition";

}  // namespace dbcore
