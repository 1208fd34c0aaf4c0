#pragma once

#include <cstdint>
#include <memory>
#include <string>

class KRValue;

// Root of every class of the interface: identity, description, equality, hash and key-value coding.
class KRObject : public std::enable_shared_from_this<KRObject> {
 public:
  virtual ~KRObject() = default;
  KRObject(const KRObject&) = delete;
  KRObject& operator=(const KRObject&) = delete;

  // The demangled C++ class name of the dynamic type.
  std::string className() const;
  // "<ClassName: 0x...>": class name and address.
  std::string defaultDescription() const;
  virtual std::string description() const;
  // Identity unless a class defines value equality.
  virtual bool isEqual(const std::shared_ptr<const KRObject>& other) const;
  virtual uint64_t hash() const;

  // Key-value coding. Unknown keys go to the *UndefinedKey operations, which raise by default.
  virtual KRValue valueForKey(const std::string& key) const;
  virtual KRValue valueForUndefinedKey(const std::string& key) const;
  virtual void setValueForKey(const KRValue& value, const std::string& key);
  virtual void setValueForUndefinedKey(const KRValue& value, const std::string& key);
  // Dotted key path: each component is asked of the value the previous one gave.
  KRValue valueForKeyPath(const std::string& keyPath) const;

  // Raises the unknown-key exception of key-value coding for a receiver and operation.
  [[noreturn]] static void raiseUndefinedKey(const std::string& receiver, const std::string& operation,
                                             const std::string& key);

 protected:
  KRObject() = default;
};

using KRObjectPtr = std::shared_ptr<KRObject>;

// The result of ordering two values.
enum KRComparisonResult : int { KROrderedAscending = -1, KROrderedSame = 0, KROrderedDescending = 1 };
