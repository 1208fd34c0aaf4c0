#include "KRFoundation/KRObject.hpp"

#include <cxxabi.h>

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <typeinfo>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRHashing.hpp"
#include "KRFoundation/KRValue.hpp"

std::string KRObject::className() const {
  const char* mangled = typeid(*this).name();
  int status = 0;
  std::unique_ptr<char, decltype(&std::free)> demangled(
      abi::__cxa_demangle(mangled, nullptr, nullptr, &status), &std::free);
  return status == 0 && demangled ? std::string(demangled.get()) : std::string(mangled);
}

std::string KRObject::defaultDescription() const {
  char address[32];
  std::snprintf(address, sizeof address, "%p", static_cast<const void*>(this));
  return "<" + className() + ": " + address + ">";
}

std::string KRObject::description() const { return defaultDescription(); }

bool KRObject::isEqual(const std::shared_ptr<const KRObject>& other) const { return other.get() == this; }

uint64_t KRObject::hash() const { return KRHashing::mix(reinterpret_cast<uintptr_t>(this)); }

KRValue KRObject::valueForKey(const std::string& key) const { return valueForUndefinedKey(key); }

KRValue KRObject::valueForUndefinedKey(const std::string& key) const {
  raiseUndefinedKey(defaultDescription(), "valueForUndefinedKey:", key);
}

void KRObject::setValueForKey(const KRValue& value, const std::string& key) {
  setValueForUndefinedKey(value, key);
}

void KRObject::setValueForUndefinedKey(const KRValue&, const std::string& key) {
  raiseUndefinedKey(defaultDescription(), "setValue:forUndefinedKey:", key);
}

KRValue KRObject::valueForKeyPath(const std::string& keyPath) const {
  const size_t dot = keyPath.find('.');
  if (dot == std::string::npos) return valueForKey(keyPath);
  return valueForKey(keyPath.substr(0, dot)).valueForKeyPath(keyPath.substr(dot + 1));
}

void KRObject::raiseUndefinedKey(const std::string& receiver, const std::string& operation,
                                 const std::string& key) {
  KRException::raise(KRException::NSUnknownKeyException,
                     "[" + receiver + " " + operation +
                         "]: this class is not key value coding-compliant for the key " + key + ".");
}
