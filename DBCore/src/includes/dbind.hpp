#pragma once

#include <memory>
#include <tuple>

namespace dbcore {

// A record bound to further records or ids, written together: DBind<DBRefFolder, long long,
// std::shared_ptr<DBPath>> is a referenced folder with its parent id and its path.
template <class Record, class... Bound>
struct DBind {
  std::shared_ptr<Record> record;
  std::tuple<Bound...> bound;

  DBind(std::shared_ptr<Record> r, Bound... b) : record(std::move(r)), bound(std::move(b)...) {}
};

}  // namespace dbcore
