#pragma once

#include <concepts>
#include <cstddef>
#include <exception>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRValue.hpp"

// One argument of a log format, captured when the line is logged: an integer (with the byte width
// of its type, as printf sees it), a floating-point number, a text, a pointer or nil. Objects keep
// their address and the description that `%@` prints.
class KRLogArgument {
 public:
  enum class Kind { Nil, Signed, Unsigned, Floating, Text, Pointer };

  KRLogArgument(std::nullptr_t) {}
  template <std::integral T>
  KRLogArgument(T value)
      : kind_(std::is_signed_v<T> ? Kind::Signed : Kind::Unsigned),
        bits_(static_cast<unsigned long long>(value)),
        byteWidth_(sizeof(T)) {}
  template <std::floating_point T>
  KRLogArgument(T value) : kind_(Kind::Floating), floating_(static_cast<double>(value)) {}
  template <class T>
  requires std::is_enum_v<T> KRLogArgument(T value)
      : KRLogArgument(static_cast<std::underlying_type_t<T>>(value)) {}
  KRLogArgument(const char* text);
  KRLogArgument(std::string_view text);
  KRLogArgument(const std::string& text);
  KRLogArgument(const std::wstring& text);
  KRLogArgument(const KRString& text);
  // Any value or handle (numbers, dates, arrays, sets, dictionaries): numbers stay numbers.
  KRLogArgument(const KRValue& value);
  KRLogArgument(const KRException& exception);
  KRLogArgument(const std::exception& exception);
  // Objects print their description; other pointers print their address.
  template <class T>
  requires(!std::same_as<std::remove_cv_t<T>, char>) KRLogArgument(T* pointer)
      : KRLogArgument(fromPointer(pointer)) {}
  template <class T>
  KRLogArgument(const std::shared_ptr<T>& pointer) : KRLogArgument(pointer.get()) {}

  Kind kind() const { return kind_; }
  bool isInteger() const { return kind_ == Kind::Signed || kind_ == Kind::Unsigned; }
  bool isNumber() const { return isInteger() || kind_ == Kind::Floating; }
  // The integer read in its own byte width as signed or unsigned, the way printf reinterprets it.
  long long signedValue() const;
  unsigned long long unsignedValue() const;
  double doubleValue() const;
  const void* pointer() const { return pointer_; }
  // What `%@` and `%s` print: "(null)" for nil.
  std::string description() const;

 private:
  KRLogArgument(Kind kind, std::string text) : kind_(kind), text_(std::move(text)) {}
  KRLogArgument(const void* address, std::optional<std::string> description)
      : kind_(Kind::Pointer), pointer_(address), text_(std::move(description)) {}
  static KRLogArgument fromValue(const KRValue& value);
  static KRLogArgument fromNumber(const KRNumber& number);
  static KRLogArgument fromObject(const KRObject* object);
  template <class T>
  static KRLogArgument fromPointer(T* pointer) {
    if constexpr (std::derived_from<T, KRObject>) {
      return fromObject(pointer);
    } else {
      return KRLogArgument(static_cast<const void*>(pointer), std::nullopt);
    }
  }

  Kind kind_ = Kind::Nil;
  unsigned long long bits_ = 0;
  size_t byteWidth_ = 0;
  double floating_ = 0;
  const void* pointer_ = nullptr;
  std::optional<std::string> text_;
};
