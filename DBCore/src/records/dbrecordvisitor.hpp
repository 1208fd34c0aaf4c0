#pragma once

#include <tuple>

#include "dbexception.hpp"
#include "dbrecords.hpp"

namespace dbcore {

// Calls a generic function with a record as its concrete record type.
class DBRecordVisitor {
 public:
  template <class F>
  static void visit(DBEntity& record, F&& function) {
    if (!visitAs(record, function, static_cast<DBRecordTypes*>(nullptr))) {
      throw DBException("A record of unknown type " + std::to_string(record.type()));
    }
  }

 private:
  template <class F, class... Records>
  static bool visitAs(DBEntity& record, F& function, std::tuple<Records...>*) {
    return (tryAs<Records>(record, function) || ...);
  }

  template <class Record, class F>
  static bool tryAs(DBEntity& record, F& function) {
    auto* concrete = dynamic_cast<Record*>(&record);
    if (!concrete) return false;
    function(*concrete);
    return true;
  }
};

}  // namespace dbcore
