#pragma once

#include <memory>

#include "dbexception.hpp"

namespace dbcore {

// The default check of a batch write: every record must be there.
template <class T>
struct ValueCheckDefault {
  static void check(const std::shared_ptr<T>& record) {
    if (!record) throw DBException("A batch write holds an empty record");
  }
};

// The default check of a link: both records must be there and saved.
template <class A, class B>
struct PairCheckDefault {
  static void check(const std::shared_ptr<A>& a, const std::shared_ptr<B>& b) {
    if (!a || !b) throw DBException("A link names an empty record");
    if (!a->is_saved() || !b->is_saved()) throw DBException("A link names a record that is not saved");
  }
};

}  // namespace dbcore
