#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "dbconnection.hpp"
#include "dbrecordio.hpp"
#include "dbschema.hpp"
#include "support/KRTemporaryDirectory.hpp"

// A test with a connection to a fresh catalog file: the current schema and the hidden root records.
class DBCatalogTestBase : public testing::Test {
 protected:
  void SetUp() override {
    connection = std::make_unique<dbcore::DBConnection>(directory.file("catalog.db"));
    connection->transaction([this] {
      dbcore::DBSchema::migrate(*connection, 0);
      dbcore::DBSchema::createRootRecords(*connection);
    });
  }

  // Writes the record and returns it, saved.
  template <class T>
  std::shared_ptr<T> saved(T record) {
    auto shared = std::make_shared<T>(std::move(record));
    dbcore::DBRecordIO::write(*connection, *shared);
    return shared;
  }

  // The ids of the records, in order.
  template <class T>
  static std::vector<long long> ids(const std::vector<std::shared_ptr<T>>& records) {
    std::vector<long long> result;
    for (const auto& record : records) result.push_back(record->id());
    return result;
  }

  // The integers of the first column of a query's rows (SQL of the test's own).
  std::set<long long> queryIds(const std::string& sql) {
    const dbcore::DBStatementLease statement = connection->prepare(sql);
    std::set<long long> result;
    while (statement->step()) result.insert(statement->columnInt64(0));
    return result;
  }

  KRTemporaryDirectory directory;
  std::unique_ptr<dbcore::DBConnection> connection;
};
