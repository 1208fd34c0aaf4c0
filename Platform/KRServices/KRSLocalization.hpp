#pragma once

#include <shared_mutex>
#include <string>
#include <unordered_map>

#include "KRFoundation/KRString.hpp"

// Localized strings from tables of key -> text loaded from JSON files. A key that no table has
// stands for itself. Thread-safe.
class KRSLocalization {
 public:
  // The loaded text for `key`, or `key` itself. The comment only documents the key for translators.
  static KRString localizedStringForKey(const KRString& key, const KRString& comment);
  // Loads a JSON object whose values are all strings and merges it over the loaded tables (a later
  // table wins). Returns false, changing nothing, for a missing file, bad JSON or any other shape.
  static bool loadTableFromFile(const std::string& path);
  static void removeAllTables();

 private:
  struct Table {
    std::shared_mutex mutex;
    std::unordered_map<std::string, std::string> texts;
  };
  static Table& table();
};
