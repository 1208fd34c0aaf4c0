#pragma once

#include <algorithm>
#include <memory>
#include <string>
#include <unordered_set>
#include <vector>

#include "dbconnection.hpp"
#include "dbrecordio.hpp"
#include "dbrecords.hpp"

namespace dbcore {

// The trees of collections, referenced folders and smart filters: every tree table has a parent_id
// column (NULL for a top-level record). Siblings are ordered by their order field, then by id.
class DBTree {
 public:
  static constexpr long long kRootId = 1;

  template <class T>
  static std::vector<std::shared_ptr<T>> children(DBConnection& connection, long long parentId) {
    static const DBStaticSql kSql(DBRecordIO::selectSql<T>() + " WHERE parent_id = ? ORDER BY " +
                                  orderClause<T>());
    const DBStatementLease statement = connection.prepare(kSql);
    statement->bind(1, static_cast<int64_t>(parentId));
    return DBRecordIO::readAll<T>(*statement);
  }

  // Every record below the parent, depth first, siblings in tree order; a record met twice (a cycle in a
  // damaged file) is taken once.
  template <class T>
  static std::vector<std::shared_ptr<T>> descendants(DBConnection& connection, long long parentId) {
    std::vector<std::shared_ptr<T>> result;
    std::unordered_set<long long> seen{parentId};
    std::vector<std::shared_ptr<T>> pending = children<T>(connection, parentId);
    std::reverse(pending.begin(), pending.end());
    while (!pending.empty()) {
      std::shared_ptr<T> next = std::move(pending.back());
      pending.pop_back();
      if (!seen.insert(next->id()).second) continue;
      auto below = children<T>(connection, next->id());
      pending.insert(pending.end(), below.rbegin(), below.rend());
      result.push_back(std::move(next));
    }
    return result;
  }

  // The parent's id, or 0 for a top-level or missing record.
  template <class T>
  static long long parentId(DBConnection& connection, long long id) {
    static const DBStaticSql kSql(std::string("SELECT parent_id FROM ") + T::kTableName +
                                  " WHERE _id_int_64 = ?");
    const DBStatementLease statement = connection.prepare(kSql);
    statement->bind(1, static_cast<int64_t>(id));
    return statement->step() ? statement->columnInt64(0) : 0;
  }

  template <class T>
  static void setParent(DBConnection& connection, long long id, long long parentId) {
    static const DBStaticSql kSql(std::string("UPDATE ") + T::kTableName +
                                  " SET parent_id = ? WHERE _id_int_64 = ?");
    const DBStatementLease statement = connection.prepare(kSql);
    if (parentId > 0) {
      statement->bind(1, static_cast<int64_t>(parentId));
    } else {
      statement->bindNull(1);
    }
    statement->bind(2, static_cast<int64_t>(id)).execute();
  }

  // True when `ancestor` is `id` itself or above it. A damaged file may hold a cycle: the walk stops
  // with an exception after more steps than any real tree is deep.
  template <class T>
  static bool isAncestorOrSelf(DBConnection& connection, long long ancestor, long long id) {
    int steps = 0;
    for (long long current = id; current > 0; current = parentId<T>(connection, current)) {
      if (current == ancestor) return true;
      if (++steps > kMaximumDepth) throw DBException("The tree holds a cycle");
    }
    return false;
  }

  static constexpr int kMaximumDepth = 10000;

 private:
  template <class T>
  static std::string orderClause() {
    if constexpr (requires(T record) { record.order; }) {
      return "order_float, _id_int_64";
    } else {
      return "_id_int_64";
    }
  }
};

}  // namespace dbcore
