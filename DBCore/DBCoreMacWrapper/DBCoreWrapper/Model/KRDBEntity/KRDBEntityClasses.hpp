#pragma once

// Fills the entity class registry with every concrete entity class of the layer. Classes do not register
// themselves from static objects (a static library's linker would drop them); this one explicit function
// does, once, before the first catalog opens. Thread-safe.
class KRDBEntityClasses {
 public:
  static void registerAll();
};
