#include "KRServices/KRBaseInjectorService.hpp"

#include <mutex>

KRBaseInjectorService::Registry& KRBaseInjectorService::registry() {
  static Registry registry;
  return registry;
}

void KRBaseInjectorService::bind(std::type_index protocol, std::shared_ptr<void> implementation) {
  Registry& bindings = registry();
  std::unique_lock lock(bindings.mutex);
  if (implementation) {
    bindings.implementations.insert_or_assign(protocol, std::move(implementation));
  } else {
    bindings.implementations.erase(protocol);
  }
}

std::shared_ptr<void> KRBaseInjectorService::resolve(std::type_index protocol) {
  Registry& bindings = registry();
  std::shared_lock lock(bindings.mutex);
  const auto found = bindings.implementations.find(protocol);
  if (found == bindings.implementations.end()) return nullptr;
  return found->second;
}
