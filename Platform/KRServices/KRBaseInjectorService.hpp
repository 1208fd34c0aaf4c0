#pragma once

#include <memory>
#include <shared_mutex>
#include <typeindex>
#include <unordered_map>

// Process-wide registry from a protocol (an abstract interface) to the object implementing it
// (typically a factory). Subclasses share the one registry. Thread-safe.
class KRBaseInjectorService {
 public:
  // Binds `Protocol` to the implementation, replacing an earlier binding. An empty pointer unbinds.
  template <class Protocol>
  static void bindProtocol(std::shared_ptr<Protocol> implementationClass) {
    bind(typeid(Protocol), std::move(implementationClass));
  }
  // The implementation bound to `Protocol`, or an empty pointer.
  template <class Protocol>
  static std::shared_ptr<Protocol> resolveImplementationClassForProtocol() {
    return std::static_pointer_cast<Protocol>(resolve(typeid(Protocol)));
  }
  template <class Protocol>
  static void unbindProtocol() {
    bind(typeid(Protocol), nullptr);
  }

 private:
  struct Registry {
    std::shared_mutex mutex;
    std::unordered_map<std::type_index, std::shared_ptr<void>> implementations;
  };
  static Registry& registry();
  static void bind(std::type_index protocol, std::shared_ptr<void> implementation);
  static std::shared_ptr<void> resolve(std::type_index protocol);
};
