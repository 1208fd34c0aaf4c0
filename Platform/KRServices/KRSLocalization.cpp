#include "KRServices/KRSLocalization.hpp"

#include <fstream>
#include <mutex>
#include <nlohmann/json.hpp>
#include <optional>
#include <sstream>

namespace {

// The contents of a file, or nothing when it is missing, unreadable (a folder) or empty. Stream
// insertion turns read errors into a failed state instead of exceptions.
std::optional<std::string> readFile(const std::string& path) {
  std::ifstream stream(path, std::ios::binary);
  std::ostringstream contents;
  contents << stream.rdbuf();
  if (!contents) return std::nullopt;
  return std::move(contents).str();
}

// The key -> text entries of a JSON file, or nothing when it is not a JSON object of strings.
std::optional<std::unordered_map<std::string, std::string>> readTexts(const std::string& path) {
  const std::optional<std::string> contents = readFile(path);
  if (!contents) return std::nullopt;
  const nlohmann::json json = nlohmann::json::parse(*contents, nullptr, /*allow_exceptions=*/false);
  if (!json.is_object()) return std::nullopt;
  std::unordered_map<std::string, std::string> texts;
  for (const auto& [key, text] : json.items()) {
    if (!text.is_string()) return std::nullopt;
    texts.emplace(key, text.get<std::string>());
  }
  return texts;
}

}  // namespace

KRSLocalization::Table& KRSLocalization::table() {
  static Table table;
  return table;
}

KRString KRSLocalization::localizedStringForKey(const KRString& key, const KRString& /*comment*/) {
  Table& tables = table();
  std::shared_lock lock(tables.mutex);
  const auto found = tables.texts.find(key.str());
  if (found == tables.texts.end()) return key;
  return KRString(found->second);
}

bool KRSLocalization::loadTableFromFile(const std::string& path) {
  std::optional<std::unordered_map<std::string, std::string>> texts = readTexts(path);
  if (!texts) return false;
  Table& tables = table();
  std::unique_lock lock(tables.mutex);
  for (auto& [key, text] : *texts) tables.texts.insert_or_assign(key, std::move(text));
  return true;
}

void KRSLocalization::removeAllTables() {
  Table& tables = table();
  std::unique_lock lock(tables.mutex);
  tables.texts.clear();
}
