#pragma once

#include <span>
#include <string>

#include "KRServices/KRLogArgument.hpp"

// printf-style formatting over captured log arguments. `%@` prints an argument's description;
// flags, width and precision of the other conversions go through to snprintf. Length modifiers
// are read from the arguments themselves (only hh and h narrow the value). Formatting never fails:
// a conversion without an argument, an unknown conversion or a format ending inside a conversion
// is copied as written; an argument that does not fit its conversion prints its description.
class KRLogFormatter {
 public:
  static std::string format(const char* format, std::span<const KRLogArgument> arguments);
};
