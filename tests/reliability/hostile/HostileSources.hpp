#pragma once

#include <filesystem>
#include <map>
#include <string>
#include <vector>

namespace reliability {

// The files the cases start from, made once in a folder of their own: a valid catalog written through
// the facade, the committed -wal of a second, different catalog, another application's SQLite database
// with a committed -wal and a hot rollback journal of its own.
class HostileSources {
 public:
  explicit HostileSources(const std::filesystem::path& folder);

  const std::string& catalog() const { return catalog_; }
  const std::string& foreignCatalogWal() const { return foreignCatalogWal_; }
  const std::string& otherDatabase() const { return otherDatabase_; }
  const std::string& otherDatabaseWal() const { return otherDatabaseWal_; }
  const std::string& otherDatabaseHotJournal() const { return otherDatabaseHotJournal_; }
  size_t pageSize() const { return pageSize_; }
  // The catalog's tables with their columns, in column order.
  const std::map<std::string, std::vector<std::string>>& tables() const { return tables_; }
  // The catalog's named indexes.
  const std::vector<std::string>& indexes() const { return indexes_; }

 private:
  void makeCatalog();
  void readSchema(const std::filesystem::path& file);
  void makeForeignCatalogWal();
  void makeOtherDatabase();
  void makeOtherDatabaseWal();
  void makeOtherDatabaseHotJournal();
  std::filesystem::path copyOfOtherDatabase(const std::string& name) const;

  std::filesystem::path folder_;
  std::string catalog_;
  std::string foreignCatalogWal_;
  std::string otherDatabase_;
  std::string otherDatabaseWal_;
  std::string otherDatabaseHotJournal_;
  size_t pageSize_ = 0;
  std::map<std::string, std::vector<std::string>> tables_;
  std::vector<std::string> indexes_;
};

}  // namespace reliability
