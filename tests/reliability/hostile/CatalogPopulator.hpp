#pragma once

#include <memory>
#include <string>
#include <vector>

#include "dbreactor.hpp"

namespace reliability {

// Fills an initialized catalog through the facade with records of every kind and links in every link
// table, their texts starting with a label so that two catalogs differ.
class CatalogPopulator {
 public:
  CatalogPopulator(dbcore::DBReactor& reactor, const std::wstring& label);

  void fill(int imageCount);

 private:
  void writeImages(int count);
  void writeAttributes();
  void writeCollections();
  void writeReferencedFolder();
  void writeHistory();
  void writeFavorite(const std::shared_ptr<dbcore::DBEntity>& record);

  dbcore::DBReactor& reactor_;
  std::wstring label_;
  std::vector<std::shared_ptr<dbcore::DBPath>> paths_;
  std::vector<std::shared_ptr<dbcore::DBImage>> images_;
};

}  // namespace reliability
