#pragma once

namespace dbcore {

// Reports a failed engine assertion (its text, file and line) on stderr and stops the program.
[[noreturn]] void assertionFailed(const char* expression, const char* file, int line);

}  // namespace dbcore

// Checks a programming invariant of the engine in every build type.
#define DB_ASSERT(expression) \
  ((expression) ? static_cast<void>(0) : ::dbcore::assertionFailed(#expression, __FILE__, __LINE__))
