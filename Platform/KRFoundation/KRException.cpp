#include "KRFoundation/KRException.hpp"

KRException::KRException(KRString name, KRString reason, KRDictionary userInfo)
    : name_(std::move(name)), reason_(std::move(reason)), userInfo_(std::move(userInfo)) {
  whatText_ = description();
}

void KRException::raise(const KRString& name, const KRString& reason) { throw KRException(name, reason); }

std::string KRException::description() const {
  if (reason_.isNil()) return name_.str();
  return name_.str() + ": " + reason_.str();
}
