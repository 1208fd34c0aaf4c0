#include "Model/KRDBFilteredImagesFetchRequest/KRPrepareCondtionsHelper.hpp"

#include <algorithm>
#include <cctype>
#include <cmath>
#include <ctime>
#include <mutex>

#include "KRFoundation/KRDate.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRExpression.hpp"
#include "KRFoundation/KRValue.hpp"

const char* const KRPrepareConditionsStartMatFormula = "$MAT_FUNCTION[";
const char* const KRPrepareConditionsEndMatFormula = "]";

namespace {

// The evaluated object of formulas: it stands for the helper class, whose operations the registered
// functions answer.
const KRValue& helperClassObject() {
  static const KRValue object(KRString("KRPrepareCondtionsHelper"));
  return object;
}

void registerHelperFunction(const std::string& name, double (*operation)()) {
  KRExpression::registerFunction(name, [operation](const KRValue& receiver) -> KRValue {
    if (!(receiver == helperClassObject())) return KRValue();
    return operation();
  });
}

void registerHelperFunctions() {
  static std::once_flag once;
  std::call_once(once, [] {
    registerHelperFunction("currentDate", &KRPrepareCondtionsHelper::currentDate);
    registerHelperFunction("currentDayInterval", &KRPrepareCondtionsHelper::currentDayInterval);
    registerHelperFunction("dayInterval", &KRPrepareCondtionsHelper::dayInterval);
  });
}

}  // namespace

KRString KRPrepareCondtionsHelper::prepareCondition(const KRString& condition) {
  Range marker = matRangeForString(condition);
  if (condition.empty() || !marker.found()) return condition;
  std::string text = condition.str();
  while (marker.found()) {
    const size_t formulaStart = marker.location + marker.length;
    const size_t end = text.find(KRPrepareConditionsEndMatFormula, formulaStart);
    if (end == std::string::npos) return KRString();
    KRString value;
    try {
      value = calculateFormula(text.substr(formulaStart, end - formulaStart));
    } catch (const KRException&) {
      return KRString();
    }
    text.replace(marker.location, end + 1 - marker.location, value.str());
    marker = matRangeForString(text);
  }
  return text;
}

KRPrepareCondtionsHelper::Range KRPrepareCondtionsHelper::matRangeForString(const KRString& string) {
  const std::string& text = string.str();
  const std::string marker = KRPrepareConditionsStartMatFormula;
  const auto sameLetter = [](char a, char b) {
    return std::tolower(static_cast<unsigned char>(a)) == std::tolower(static_cast<unsigned char>(b));
  };
  const auto hit = std::search(text.begin(), text.end(), marker.begin(), marker.end(), sameLetter);
  if (hit == text.end()) return {};
  return {static_cast<size_t>(hit - text.begin()), marker.size()};
}

KRString KRPrepareCondtionsHelper::calculateFormula(const KRString& formula) {
  registerHelperFunctions();
  const auto expression = KRExpression::expressionWithFormat(formula.str());
  const KRValue value = expression->expressionValueWithObject(helperClassObject());
  const double number = value.isNumber() ? value.number().doubleValue() : 0.0;
  // Values beyond the 64-bit range (and NaN) have no integer text: they count as 0.
  const bool representable = std::isfinite(number) && std::fabs(number) < 9.2e18;
  const long integer = representable ? static_cast<long>(number) : 0;
  return std::to_string(integer);
}

double KRPrepareCondtionsHelper::currentDate() { return KRDate::date().timeIntervalSince1970(); }

double KRPrepareCondtionsHelper::currentDayInterval() {
  const double now = currentDate();
  const std::time_t seconds = static_cast<std::time_t>(std::floor(now));
  std::tm local{};
  localtime_r(&seconds, &local);
  local.tm_hour = 0;
  local.tm_min = 0;
  local.tm_sec = 0;
  local.tm_isdst = -1;
  return now - static_cast<double>(std::mktime(&local));
}
