#pragma once

#include <cstdint>
#include <memory>

#include "dbconnection.hpp"
#include "dbexception.hpp"
#include "dbrecordio.hpp"
#include "dbtree.hpp"

namespace dbcore {

// What the facade's operations share: checks of their arguments and the writing of tree records.
struct DBReactorSupport {
  static int64_t id64(long long id) { return static_cast<int64_t>(id); }

  template <class T>
  static void requireRecord(const std::shared_ptr<T>& record) {
    if (!record) throw DBException("An operation was given an empty record");
  }

  // Inserts an unsaved tree record under the parent (0: at the top of a tree without root) and writes it.
  template <class T>
  static void writeTreeRecord(DBConnection& connection, T& record, long long parentId) {
    const bool isNew = !record.is_saved();
    DBRecordIO::write(connection, record);
    if (isNew && record.id() != DBTree::kRootId) DBTree::setParent<T>(connection, record.id(), parentId);
  }
};

}  // namespace dbcore
