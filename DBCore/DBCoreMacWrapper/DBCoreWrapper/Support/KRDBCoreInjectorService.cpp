#include "Support/KRDBCoreInjectorService.hpp"

#include <memory>
#include <mutex>

#include "Model/KRDBEntity/KRDBDataStorageFactoryBase.hpp"

void KRDBCoreInjectorService::load() {
  static std::once_flag once;
  std::call_once(
      once, [] { bindProtocol<KRDBDataStorageCreating>(std::make_shared<KRDBDataStorageFactoryBase>()); });
}
