#include "dbreactor.hpp"

#include "dbreactorsupport.hpp"
#include "dbselectqueryrunner.hpp"

// Select queries and counts.

namespace dbcore {

template <>
unsigned long long DBReactor::Count<DBImage>() const {
  static const DBStaticSql kSql("SELECT count(*) FROM images");
  return static_cast<unsigned long long>(connection().queryInt64(kSql));
}

template <DBQueriedRecord T>
std::vector<std::shared_ptr<T>> DBReactor::GetBySelectQuery(
    std::shared_ptr<DBEntitySelectQuery> const& query) {
  return DBSelectQueryRunner::run<T>(connection(), query);
}

template std::vector<std::shared_ptr<DBImage>> DBReactor::GetBySelectQuery<DBImage>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBPath>> DBReactor::GetBySelectQuery<DBPath>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBVolume>> DBReactor::GetBySelectQuery<DBVolume>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBRefFolder>> DBReactor::GetBySelectQuery<DBRefFolder>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBUserImgAttrib>> DBReactor::GetBySelectQuery<DBUserImgAttrib>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBExivImgAttrib>> DBReactor::GetBySelectQuery<DBExivImgAttrib>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBEntityFavoriteAlias>>
DBReactor::GetBySelectQuery<DBEntityFavoriteAlias>(std::shared_ptr<DBEntitySelectQuery> const&);

}  // namespace dbcore
