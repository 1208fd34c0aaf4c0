#pragma once

#include <memory>
#include <string>

#include "KRFoundation/KRValue.hpp"

// An error object: domain, code and user info.
class KRError : public KRObject {
 public:
  static constexpr const char* NSLocalizedDescriptionKey = "NSLocalizedDescription";

  static std::shared_ptr<KRError> errorWithDomain(KRString domain, long long code,
                                                  KRDictionary userInfo = {});

  const KRString& domain() const { return domain_; }
  long long code() const { return code_; }
  const KRDictionary& userInfo() const { return userInfo_; }
  // The user info's localized description, or a generic text naming the domain and code.
  KRString localizedDescription() const;
  std::string description() const override;

 protected:
  KRError(KRString domain, long long code, KRDictionary userInfo);

 private:
  KRString domain_;
  long long code_;
  KRDictionary userInfo_;
};

using KRErrorPtr = std::shared_ptr<KRError>;
