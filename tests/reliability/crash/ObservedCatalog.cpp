#include "ObservedCatalog.hpp"

#include "CrashOperation.hpp"

namespace reliability {

std::map<long long, GroupState> ObservedCatalog::read(RawDatabase& database) {
  std::map<long long, GroupState> groups;
  readColumn(database, "SELECT guid_wide_ch, count(*) FROM images GROUP BY 1", groups,
             [](GroupState& state, long long value) { state.images = static_cast<int>(value); });
  readColumn(database, "SELECT origin_path_wide_ch, count(*) FROM image_user_attributes GROUP BY 1", groups,
             [](GroupState& state, long long value) { state.userAttributes = static_cast<int>(value); });
  readColumn(database, "SELECT camera_model_wide_ch, count(*) FROM image_exiv_attributes GROUP BY 1", groups,
             [](GroupState& state, long long value) { state.exifAttributes = static_cast<int>(value); });
  readColumn(database, "SELECT guid_wide_ch, width FROM images WHERE path_wide_ch = guid_wide_ch || '/0'",
             groups, [](GroupState& state, long long value) { state.width = value; });
  return groups;
}

void ObservedCatalog::readColumn(RawDatabase& database, const std::string& sql,
                                 std::map<long long, GroupState>& groups, const Setter& set) {
  for (const auto& row : database.rows(sql)) {
    const size_t separator = row.rfind('|');
    const auto group = CrashOperation::groupOfMarker(row.substr(0, separator));
    if (group) set(groups[*group], std::stoll(row.substr(separator + 1)));
  }
}

}  // namespace reliability
