#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "KRFoundation/KRNumber.hpp"

// Splits a predicate or expression format string into tokens. Shared by predicates and expressions.
//
// - Words are keys, or keywords when they spell a reserved word in any case (AND, in, Self...);
//   "#word" is always a key. Keywords come out in upper case. "#" before a quoted string makes a key of
//   any text, read with the escapes of strings ("#'first name'", "#'2x'", "#''"), for key names that
//   are not words.
// - Numbers are decimal: integers (signed, then unsigned 64-bit, then double when too large) and
//   decimals with optional exponents. A minus sign is never part of a number: it is a symbol.
// - Strings are single- or double-quoted, with the escapes \n \t \r \\ \" \' and \uXXXX (surrogate
//   pairs combine into one character).
// - Format arguments: %@, %K and the number conversions %d %i %u %f %g %e, also with l or ll.
// - Positions are byte offsets into the format. Bad input (invalid UTF-8, an unterminated string, an
//   unknown escape or character) raises NSInvalidArgumentException naming the position.
class KRPredicateLexer {
 public:
  struct Token {
    enum class Kind { End, Identifier, Keyword, Number, String, Variable, Argument, Symbol };
    Kind kind = Kind::End;
    // Key name, upper-case keyword, string contents, variable name, conversion ("@", "K", "ld") or symbol.
    std::string text;
    KRNumber number;
    size_t position = 0;
  };

  // The tokens of the format, ending with one End token.
  static std::vector<Token> tokenize(const std::string& format);
  // Whether a word (in any case) is reserved by the format syntax, so that a key spelled so needs "#".
  static bool isReservedWord(std::string_view word);
  // Whether a key name reads back as one key by itself: a word, optionally after "@" (as in "@count").
  // Reserved words are such names too, but need "#" in front.
  static bool isPlainName(std::string_view name);
  // Raises NSInvalidArgumentException: the format could not be parsed at a byte position.
  [[noreturn]] static void raiseParseError(const std::string& format, size_t position,
                                           const std::string& detail);

 private:
  explicit KRPredicateLexer(const std::string& format) : format_(format) {}

  void validateEncoding() const;
  void skipWhitespace();
  Token nextToken();
  // A key or a keyword.
  Token lexWord();
  // "#key" or "#'quoted key'", never a keyword.
  Token lexEscapedKey();
  // "#key" (never a keyword) or "$variable".
  Token lexPrefixedName(Token::Kind kind);
  // Reads a name (optionally "@" first, as in "@count"); failures point at `tokenStart`.
  std::string readName(size_t tokenStart);
  Token lexNumber();
  Token lexString();
  Token lexArgument();
  Token lexSymbol();
  void appendEscape(std::string& text);
  char32_t readHexCharacter();
  size_t wordEnd(size_t from) const;
  bool atDigit(size_t offset) const;
  [[noreturn]] void fail(size_t position, const std::string& detail) const;

  const std::string& format_;
  size_t position_ = 0;
};
