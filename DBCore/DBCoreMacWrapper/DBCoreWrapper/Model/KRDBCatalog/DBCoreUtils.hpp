#pragma once

#include <cstdint>

#include "KRFoundation/KRException.hpp"

namespace dbcore {
class DBException;
}

// User-info keys of a converted engine exception: the operation's tag, and the engine's code.
extern const char* const KRDBExceptionDescription;
extern const char* const DBCoreExceptionCode;
// The engine's code for a failure without one.
extern const int32_t DBExceptionDomainInternal;

// Conversions between the engine and the platform. Stateless; any thread.
class DBCoreUtils {
 public:
  // The platform exception for an engine exception raised by the operation tagged `actionMark`:
  // named "DBCore", then "(code #c)" unless the code is DBExceptionDomainInternal, ", tag:t" for a
  // non-empty tag and ": d" for a non-empty description; the reason is the description (nil when
  // empty); the user info holds the code and, for a tag, the tag.
  static KRException exceptionFromDBException(const dbcore::DBException& exception,
                                              const KRString& actionMark);
};
