#include "KRServices/KRLogFormatter.hpp"

#include <algorithm>
#include <cstdio>
#include <optional>
#include <string_view>

namespace {

// One conversion of a format as written, e.g. "%-8.3lf".
struct Directive {
  std::string_view text;     // the whole conversion, from '%' on
  std::string_view options;  // flags, width and precision: "-8.3"
  int narrowing = 0;         // 1 for hh, 2 for h: integers are cut to that many bytes
  char conversion = 0;       // 0 when the format ends inside the conversion
};

constexpr std::string_view kFlags = "-+ #0";
constexpr std::string_view kDigits = "0123456789";
constexpr std::string_view kLengthModifiers = "hlqLjzt";
constexpr std::string_view kArgumentConversions = "@sdiuoxXcpfFeEgGaA";
// Longer widths or precisions are not honoured: they would only allocate huge lines.
constexpr size_t kMaxNumberDigits = 4;

// The end of the run of `characters` that starts at `position`.
size_t skip(std::string_view text, size_t position, std::string_view characters) {
  return std::min(text.find_first_not_of(characters, position), text.size());
}

// The byte width that a length modifier cuts integers to, 0 for none.
int narrowingFor(std::string_view modifiers) {
  if (modifiers == "hh") return 1;
  if (modifiers == "h") return 2;
  return 0;
}

// A conversion that is copied to the output as written.
Directive literal(std::string_view text) {
  Directive directive;
  directive.text = text;
  return directive;
}

// Parses the conversion that starts at the '%' in front of `text`. A conversion with an overlong
// number is just its '%'; one cut short by the end of the format has no conversion character.
Directive parseDirective(std::string_view text) {
  const size_t flagsEnd = skip(text, 1, kFlags);
  const size_t widthEnd = skip(text, flagsEnd, kDigits);
  size_t optionsEnd = widthEnd;
  if (optionsEnd < text.size() && text[optionsEnd] == '.') optionsEnd = skip(text, optionsEnd + 1, kDigits);
  if (widthEnd - flagsEnd > kMaxNumberDigits || optionsEnd - widthEnd > kMaxNumberDigits + 1) {
    return literal(text.substr(0, 1));
  }
  const size_t modifiersEnd = skip(text, optionsEnd, kLengthModifiers);
  if (modifiersEnd == text.size()) return literal(text);
  return Directive{.text = text.substr(0, modifiersEnd + 1),
                   .options = text.substr(1, optionsEnd - 1),
                   .narrowing = narrowingFor(text.substr(optionsEnd, modifiersEnd - optionsEnd)),
                   .conversion = text[modifiersEnd]};
}

template <class T>
std::optional<std::string> printValue(const Directive& directive, std::string_view conversion, T value) {
  std::string printfFormat = "%";
  printfFormat.append(directive.options).append(conversion);
  const int size = std::snprintf(nullptr, 0, printfFormat.c_str(), value);
  if (size < 0) return std::nullopt;
  std::string printed(static_cast<size_t>(size), '\0');
  std::snprintf(printed.data(), printed.size() + 1, printfFormat.c_str(), value);
  return printed;
}

long long narrowedSigned(const Directive& directive, const KRLogArgument& argument) {
  const long long value = argument.signedValue();
  if (directive.narrowing == 1) return static_cast<signed char>(value);
  if (directive.narrowing == 2) return static_cast<short>(value);
  return value;
}

unsigned long long narrowedUnsigned(const Directive& directive, const KRLogArgument& argument) {
  const unsigned long long value = argument.unsignedValue();
  if (directive.narrowing == 1) return static_cast<unsigned char>(value);
  if (directive.narrowing == 2) return static_cast<unsigned short>(value);
  return value;
}

std::optional<std::string> printText(const Directive& directive, const KRLogArgument& argument) {
  if (directive.options.empty()) return argument.description();
  return printValue(directive, "s", argument.description().c_str());
}

std::optional<std::string> printSigned(const Directive& directive, const KRLogArgument& argument) {
  if (!argument.isInteger()) return std::nullopt;
  return printValue(directive, "lld", narrowedSigned(directive, argument));
}

std::optional<std::string> printUnsigned(const Directive& directive, const KRLogArgument& argument) {
  if (!argument.isInteger()) return std::nullopt;
  const char conversion[] = {'l', 'l', directive.conversion, '\0'};
  return printValue(directive, conversion, narrowedUnsigned(directive, argument));
}

std::optional<std::string> printCharacter(const Directive& directive, const KRLogArgument& argument) {
  if (!argument.isInteger()) return std::nullopt;
  return printValue(directive, "c", static_cast<int>(static_cast<unsigned char>(argument.unsignedValue())));
}

std::optional<std::string> printPointer(const Directive& directive, const KRLogArgument& argument) {
  if (argument.kind() != KRLogArgument::Kind::Pointer) return std::nullopt;
  return printValue(directive, "p", argument.pointer());
}

std::optional<std::string> printFloating(const Directive& directive, const KRLogArgument& argument) {
  if (!argument.isNumber()) return std::nullopt;
  const char conversion[] = {directive.conversion, '\0'};
  return printValue(directive, conversion, argument.doubleValue());
}

std::optional<std::string> printArgument(const Directive& directive, const KRLogArgument& argument) {
  switch (directive.conversion) {
    case '@':
    case 's':
      return printText(directive, argument);
    case 'd':
    case 'i':
      return printSigned(directive, argument);
    case 'u':
    case 'o':
    case 'x':
    case 'X':
      return printUnsigned(directive, argument);
    case 'c':
      return printCharacter(directive, argument);
    case 'p':
      return printPointer(directive, argument);
    default:
      return printFloating(directive, argument);
  }
}

void appendDirective(std::string& out, const Directive& directive, std::span<const KRLogArgument> arguments,
                     size_t& nextArgument) {
  if (directive.conversion == '%') {
    out += '%';
  } else if (kArgumentConversions.find(directive.conversion) == std::string_view::npos ||
             nextArgument >= arguments.size()) {
    out.append(directive.text);
  } else {
    const KRLogArgument& argument = arguments[nextArgument++];
    const std::optional<std::string> printed = printArgument(directive, argument);
    out.append(printed ? *printed : argument.description());
  }
}

}  // namespace

std::string KRLogFormatter::format(const char* format, std::span<const KRLogArgument> arguments) {
  if (!format) return "(null)";
  std::string_view rest(format);
  std::string out;
  size_t nextArgument = 0;
  while (!rest.empty()) {
    const size_t percent = rest.find('%');
    out.append(rest.substr(0, percent));
    if (percent == std::string_view::npos) break;
    const Directive directive = parseDirective(rest.substr(percent));
    rest.remove_prefix(percent + directive.text.size());
    appendDirective(out, directive, arguments, nextArgument);
  }
  return out;
}
