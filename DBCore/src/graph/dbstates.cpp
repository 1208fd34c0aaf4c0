#include "dbstates.hpp"

#include "dbrecordio.hpp"
#include "dbresource.hpp"
#include "dbstrings.hpp"

namespace dbcore {

namespace {

std::string statesOfImageSql(const char* extraCondition) {
  return DBRecordIO::selectSql<DBImgHistoryState>() +
         " JOIN image_states ON image_states.state_id = image_history_states._id_int_64"
         " WHERE image_states.image_id = ?" +
         extraCondition + " ORDER BY image_states.position";
}

// The position after the image's last state.
int64_t nextPosition(DBConnection& connection, int64_t imageId) {
  static const DBStaticSql kSql("SELECT coalesce(max(position) + 1, 0) FROM image_states WHERE image_id = ?");
  const DBStatementLease statement = connection.prepare(kSql);
  statement->bind(1, imageId);
  return statement->step() ? statement->columnInt64(0) : 0;
}

// The state columns followed by the id of the image whose current state the row is.
std::string currentStatesSql() {
  std::string sql = DBRecordIO::selectSql<DBImgHistoryState>();
  sql.insert(sql.find(" FROM "), ", image_states.image_id");
  return sql +
         " JOIN image_states ON image_states.state_id = image_history_states._id_int_64"
         " WHERE image_states.is_current = 1";
}

}  // namespace

std::vector<std::shared_ptr<DBImgHistoryState>> DBStates::states(DBConnection& connection, int64_t imageId) {
  static const DBStaticSql kSql(statesOfImageSql(""));
  const DBStatementLease statement = connection.prepare(kSql);
  statement->bind(1, imageId);
  return DBRecordIO::readAll<DBImgHistoryState>(*statement);
}

std::shared_ptr<DBImgHistoryState> DBStates::currentState(DBConnection& connection, int64_t imageId) {
  static const DBStaticSql kSql(statesOfImageSql(" AND image_states.is_current = 1"));
  const DBStatementLease statement = connection.prepare(kSql);
  statement->bind(1, imageId);
  return DBRecordIO::readOne<DBImgHistoryState>(*statement);
}

std::map<long long, std::shared_ptr<DBImgHistoryState>> DBStates::allCurrentStates(DBConnection& connection) {
  static const DBStaticSql kSql(currentStatesSql());
  const DBStatementLease statement = connection.prepare(kSql);
  const int imageColumn = static_cast<int>(DBImgHistoryState::all_columns().size());
  std::map<long long, std::shared_ptr<DBImgHistoryState>> current;
  while (statement->step())
    current.emplace(statement->columnInt64(imageColumn), DBRecordIO::read<DBImgHistoryState>(*statement));
  return current;
}

void DBStates::setCurrent(DBConnection& connection, int64_t imageId,
                          const std::shared_ptr<DBImgHistoryState>& state) {
  static const DBStaticSql kClearSql("UPDATE image_states SET is_current = 0 WHERE image_id = ?");
  static const DBStaticSql kSetSql(
      "UPDATE image_states SET is_current = 1 WHERE image_id = ? AND state_id = ?");
  connection.prepare(kClearSql)->bind(1, imageId).execute();
  if (!state) return;
  if (!state->is_saved()) DBRecordIO::write(connection, *state);
  connection.prepare(kSetSql)->bind(1, imageId).bind(2, state->id()).execute();
  if (connection.changes() > 0) return;
  link(connection, imageId, state->id(), nextPosition(connection, imageId), true);
}

void DBStates::replace(DBConnection& connection, int64_t imageId,
                       const std::vector<std::shared_ptr<DBImgHistoryState>>& list, long long current) {
  static const DBStaticSql kSql("DELETE FROM image_states WHERE image_id = ?");
  connection.prepare(kSql)->bind(1, imageId).execute();
  for (size_t position = 0; position < list.size(); ++position) {
    DBImgHistoryState& state = *list[position];
    if (!state.is_saved()) DBRecordIO::write(connection, state);
    link(connection, imageId, state.id(), static_cast<int64_t>(position),
         static_cast<long long>(position) == current);
  }
}

void DBStates::bindResources(DBConnection& connection, int64_t stateId,
                             const std::vector<std::wstring>& names) {
  static const DBStaticSql kSql("INSERT OR IGNORE INTO state_resources(state_id, resource_id) VALUES (?, ?)");
  for (const auto& name : names) {
    const int64_t resourceId = resourceNamed(connection, name);
    connection.prepare(kSql)->bind(1, stateId).bind(2, resourceId).execute();
  }
}

void DBStates::copyResources(DBConnection& connection, int64_t stateId, int64_t baseStateId) {
  static const DBStaticSql kSql(
      "INSERT OR IGNORE INTO state_resources(state_id, resource_id) "
      "SELECT ?, resource_id FROM state_resources WHERE state_id = ?");
  connection.prepare(kSql)->bind(1, stateId).bind(2, baseStateId).execute();
}

void DBStates::link(DBConnection& connection, int64_t imageId, int64_t stateId, int64_t position,
                    bool current) {
  static const DBStaticSql kSql(
      "INSERT OR REPLACE INTO image_states(image_id, state_id, position, is_current) VALUES (?, ?, ?, ?)");
  connection.prepare(kSql)
      ->bind(1, imageId)
      .bind(2, stateId)
      .bind(3, position)
      .bind(4, static_cast<int64_t>(current ? 1 : 0))
      .execute();
}

int64_t DBStates::resourceNamed(DBConnection& connection, const std::wstring& name) {
  static const DBStaticSql kSql("SELECT _id_int_64 FROM history_resources WHERE name_wide_ch = ?");
  {
    const DBStatementLease lookup = connection.prepare(kSql);
    lookup->bind(1, ws2s(name));
    if (lookup->step()) return lookup->columnInt64(0);
  }
  DBResource resource;
  resource.name = name;
  DBRecordIO::write(connection, resource);
  return resource.id();
}

}  // namespace dbcore
