#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "KRFoundation/KRObject.hpp"

// Immutable, nullable UTF-8 string handle. `==` compares text; `identical` compares objects.
class KRString {
 public:
  KRString() = default;  // nil
  KRString(const char* utf8);
  KRString(std::string utf8);
  KRString(std::string_view utf8);

  bool isNil() const { return !text_; }
  explicit operator bool() const { return text_ != nullptr; }
  // The text; empty for nil.
  const std::string& str() const;
  const char* c_str() const { return str().c_str(); }
  size_t length() const { return str().size(); }
  bool empty() const { return str().empty(); }

  bool operator==(const KRString& other) const;
  uint64_t hash() const;
  friend bool identical(const KRString& a, const KRString& b) { return a.text_ == b.text_; }

  // Lossless conversion to and from 32-bit wide strings. Invalid input becomes U+FFFD, never a crash.
  std::wstring krs_wstring() const;
  static KRString krs_stringWithWString(const std::wstring& wide);

  // Orderings: by code point (compare), ICU collation of the current locale (localizedCompare),
  // case folding (caseInsensitiveCompare) and file-name order (localizedStandardCompare).
  KRComparisonResult compare(const KRString& other) const;
  KRComparisonResult localizedCompare(const KRString& other) const;
  KRComparisonResult caseInsensitiveCompare(const KRString& other) const;
  KRComparisonResult localizedStandardCompare(const KRString& other) const;

  // Path helpers with the platform's semantics ("/" separated).
  KRString lastPathComponent() const;
  KRString stringByAppendingPathComponent(const KRString& component) const;
  KRString pathExtension() const;
  KRString stringByDeletingPathExtension() const;
  bool hasPrefix(const KRString& prefix) const;
  bool hasSuffix(const KRString& suffix) const;
  KRString stringByReplacingOccurrencesOfString(const KRString& target, const KRString& replacement) const;

 private:
  std::shared_ptr<const std::string> text_;
};
