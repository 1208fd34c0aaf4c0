#pragma once

#include "KRServices/KRBaseInjectorService.hpp"

// The object layer's bindings in the injector: KRDBDataStorageCreating to KRDBDataStorageFactoryBase.
// load() binds them once (later calls change nothing); the catalog calls it before any context exists.
// Thread-safe.
class KRDBCoreInjectorService : public KRBaseInjectorService {
 public:
  static void load();
};
