#pragma once

#include <exception>
#include <string>

#include "KRFoundation/KRValue.hpp"

// The platform exception: a name, a reason and a user info dictionary. Thrown by value.
class KRException : public std::exception {
 public:
  KRException(KRString name, KRString reason, KRDictionary userInfo = {});

  static constexpr const char* NSInvalidArgumentException = "NSInvalidArgumentException";
  static constexpr const char* NSInternalInconsistencyException = "NSInternalInconsistencyException";
  static constexpr const char* NSRangeException = "NSRangeException";
  static constexpr const char* NSUnknownKeyException = "NSUnknownKeyException";
  static constexpr const char* NSGenericException = "NSGenericException";

  // Throws a new exception with the given name and reason.
  [[noreturn]] static void raise(const KRString& name, const KRString& reason);

  const KRString& name() const { return name_; }
  const KRString& reason() const { return reason_; }
  const KRDictionary& userInfo() const { return userInfo_; }
  // "name: reason"
  std::string description() const;
  const char* what() const noexcept override { return whatText_.c_str(); }

 private:
  KRString name_;
  KRString reason_;
  KRDictionary userInfo_;
  std::string whatText_;
};
