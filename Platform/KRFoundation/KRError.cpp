#include "KRFoundation/KRError.hpp"

KRError::KRError(KRString domain, long long code, KRDictionary userInfo)
    : domain_(std::move(domain)), code_(code), userInfo_(std::move(userInfo)) {}

std::shared_ptr<KRError> KRError::errorWithDomain(KRString domain, long long code, KRDictionary userInfo) {
  return std::shared_ptr<KRError>(new KRError(std::move(domain), code, std::move(userInfo)));
}

KRString KRError::localizedDescription() const {
  KRString text = userInfo_.objectForKey(NSLocalizedDescriptionKey).string();
  if (text) return text;
  return KRString("The operation couldn\u2019t be completed. (" + domain_.str() + " error " +
                  std::to_string(code_) + ".)");
}

std::string KRError::description() const {
  return "Error Domain=" + domain_.str() + " Code=" + std::to_string(code_) + " \"" +
         localizedDescription().str() + "\"";
}
