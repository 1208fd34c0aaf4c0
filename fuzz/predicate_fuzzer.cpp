// Feeds arbitrary bytes as predicate format text, as users write in --where. A format that does not parse
// must raise NSInvalidArgumentException; one that parses is evaluated against a small photo-like record
// and its predicateFormat must parse back to an equal predicate. Evaluation may raise only what
// KRPredicate and KRExpression document: NSUnknownKeyException for a key a value does not know, and
// NSInvalidArgumentException for a missing variable, an unknown function, an invalid pattern or an
// ANY/ALL over something that is not a collection. Anything else aborts.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <initializer_list>
#include <optional>
#include <string>
#include <vector>

#include "KRFoundation/KRDate.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRExpression.hpp"
#include "KRFoundation/KRPredicate.hpp"

namespace {

[[noreturn]] void fail(const std::string& what, const std::string& format) {
  std::fprintf(stderr, "%s\nformat: %s\n", what.c_str(), format.c_str());
  std::abort();
}

const KRValue& record() {
  static const KRValue value = KRDictionary{
      {"name", "IMG_0042.CR2"},
      {"caption", "Café au bord de l'eau"},
      {"rating", 4},
      {"picked", true},
      {"exposure", 0.004},
      {"captureDate", KRDate::dateWithTimeIntervalSince1970(1'600'000'000.5)},
      {"keywords", KRArray{"beach", "Sunset", "été", 3}},
      {"labels", KRSet{"red", "green"}},
      {"exif", KRDictionary{{"iso", 200}, {"fNumber", 2.8}, {"model", "X100V"}}},
      {"folder", KRDictionary{{"path", "/Volumes/Photos/2021"}, {"images", KRArray{1, 2.5, "three"}}}},
      {"missing", KRValue::null()},
  };
  return value;
}

const KRDictionary& bindings() {
  static const KRDictionary dictionary{{"minimum", 3}, {"pattern", "IMG_.*"}, {"words", KRArray{"a", "b"}}};
  return dictionary;
}

// Format arguments for %@, %K and the number conversions.
std::vector<KRValue> arguments() { return {"rating", 2, 1.5, "exif.iso", KRArray{1, 2}}; }

bool isDocumented(const KRException& exception, std::initializer_list<const char*> names) {
  for (const char* name : names) {
    if (exception.name().str() == name) return true;
  }
  return false;
}

// The predicate, or nullopt when the format is rejected with the documented parse failure.
std::optional<KRPredicatePtr> parsed(const std::string& format) {
  try {
    return KRPredicate::predicateWithFormat(format, arguments());
  } catch (const KRException& exception) {
    if (!isDocumented(exception, {KRException::NSInvalidArgumentException})) throw;
    return std::nullopt;
  }
}

void evaluate(const KRPredicate& predicate) {
  try {
    predicate.evaluateWithObject(record(), bindings());
  } catch (const KRException& exception) {
    if (!isDocumented(exception,
                      {KRException::NSUnknownKeyException, KRException::NSInvalidArgumentException}))
      throw;
  }
}

KRPredicatePtr parsedBack(const std::string& written, const std::string& format) {
  try {
    return KRPredicate::predicateWithFormat(written);
  } catch (const KRException& exception) {
    fail("predicateFormat does not parse back: " + written + "\n" + exception.description(), format);
  }
}

void checkRoundTrip(const KRPredicatePtr& predicate, const std::string& format) {
  const std::string written = predicate->predicateFormat();
  if (!parsedBack(written, format)->isEqual(predicate)) {
    fail("predicateFormat parses back differently: " + written, format);
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
  const std::string format(reinterpret_cast<const char*>(data), size);
  const std::optional<KRPredicatePtr> predicate = parsed(format);
  if (!predicate) return 0;
  if (!*predicate) fail("predicateWithFormat answered an empty predicate", format);
  evaluate(**predicate);
  checkRoundTrip(*predicate, format);
  return 0;
}
