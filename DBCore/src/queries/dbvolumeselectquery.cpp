#include "dbvolumeselectquery.hpp"

#include "dbvolume.hpp"

namespace dbcore {

DBVolumeSelectQuery::DBVolumeSelectQuery() : DBEntitySelectQuery(DBVolume::kTableName) {}

}  // namespace dbcore
