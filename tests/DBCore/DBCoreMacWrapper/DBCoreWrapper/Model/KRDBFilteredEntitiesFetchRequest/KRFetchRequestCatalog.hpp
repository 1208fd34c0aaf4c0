#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <set>
#include <vector>

#include "KRTestExifReader.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBEntity/KRDBEntity.hpp"
#include "Model/KRDBEntity/KRDBEntityClasses.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBFilteredEntitiesFetchRequest.hpp"
#include "dbreactor.hpp"
#include "support/KRTemporaryDirectory.hpp"

// A fresh catalog file for fetch-request tests: creates records through the catalog, marks them deleted
// and runs select queries on the catalog's queue.
class KRFetchRequestCatalog {
 public:
  using Reactor = KRDBCatalog::Reactor;
  using Ids = std::set<int64_t>;

  KRFetchRequestCatalog() {
    KRDBEntityClasses::registerAll();
    catalog_ = KRDBCatalog::initWithContentsOfFile(directory_.file("catalog.krcatalog"), nullptr);
    catalog_->initializeAndUpdateIfNeaded();
  }
  ~KRFetchRequestCatalog() { catalog_->forceCloseDB(); }

  KRDBCatalog& catalog() { return *catalog_; }

  void onEngine(const KRDBCatalog::ReactorBlock& block) {
    catalog_->performSynchronously(true, [&] { catalog_->handleDBReactorBlock(block, "test", true); });
  }
  KRDBEntityArray create(int64_t type, const std::vector<KRDictionary>& infos) {
    KRDBEntityArray entities;
    catalog_->performSynchronously(true,
                                   [&] { entities = catalog_->createEntitiesWithTypeSync(type, infos); });
    return entities;
  }
  // Images named IMG_<index>.JPG with their user and exif attribute records; with `withCamera`, the
  // exif values of KRTestExifReader's camera. Image i lies in folders[i % count of folders], if any.
  // Indexes start at `first`.
  KRDBEntityArray createImages(int count, bool withCamera = false, const KRDBEntityArray& folders = {},
                               int first = 0) {
    std::vector<KRDictionary> infos;
    for (int index = first; index < first + count; ++index) {
      const std::string name = "IMG_" + std::to_string(index) + ".JPG";
      infos.push_back({{"DBImageInfoExifReader",
                        KRTestExifReader::make({"/p/" + name, 600, 400, 1000 + index,
                                                KRDate::dateWithTimeIntervalSince1970(1600000000),
                                                KRDate::dateWithTimeIntervalSince1970(1500000000)},
                                               withCamera)},
                       {"DBImageInfoImageName", name}});
      if (!folders.empty()) {
        infos.back() = infos.back().dictionaryBySettingObject(folders[index % folders.size()],
                                                              "DBImageInfoFolderDBPath");
      }
    }
    return create(KRDBEntityTypeImage, infos);
  }
  // Writes the first record of the kind with its marked-to-delete flag set.
  template <class Record>
  void markFirstToDelete() {
    const auto all = allRecords<Record>();
    ASSERT_FALSE(all.empty());
    const std::shared_ptr<dbcore::DBEntity> record = all.front();
    record->set_marked_to_delete(true);
    onEngine([&](const Reactor& reactor) { *reactor << record; });
  }
  template <class Record>
  std::vector<std::shared_ptr<Record>> select(const std::shared_ptr<dbcore::DBEntitySelectQuery>& query) {
    std::vector<std::shared_ptr<Record>> records;
    onEngine([&](const Reactor& reactor) { records = reactor->template GetBySelectQuery<Record>(query); });
    return records;
  }
  template <class Record>
  Ids selectedIds(const std::shared_ptr<dbcore::DBEntitySelectQuery>& query) {
    Ids ids;
    for (const auto& record : select<Record>(query)) ids.insert(record->id());
    return ids;
  }
  template <class Record>
  std::vector<std::shared_ptr<Record>> allRecords() {
    return select<Record>(std::make_shared<dbcore::DBEntitySelectQuery>());
  }

  // The request selects, from the engine and in memory alike, exactly the records of its kind that are
  // not marked to delete; the table holds some of each.
  template <class Record>
  void expectSelectsEveryRecordNotMarkedToDelete(KRDBFilteredEntitiesFetchRequest& request) {
    const auto all = allRecords<Record>();
    Ids notMarked;
    for (const auto& record : all) {
      if (!record->marked_to_delete()) notMarked.insert(record->id());
    }
    ASSERT_FALSE(notMarked.empty());
    ASSERT_LT(notMarked.size(), all.size());
    EXPECT_EQ(selectedIds<Record>(request.selectQuery()), notMarked);
    for (const auto& record : all) {
      const auto entity = KRDBEntity::entityWithDBEntity(record);
      EXPECT_EQ(request.isEntitySatisfyingFilterConditions(entity), notMarked.contains(record->id()))
          << "record " << record->id();
    }
  }

 private:
  KRTemporaryDirectory directory_;
  std::shared_ptr<KRDBCatalog> catalog_;
};
