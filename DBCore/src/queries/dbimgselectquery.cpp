#include "dbimgselectquery.hpp"

#include <algorithm>
#include <cstddef>
#include <utility>

#include "dbimage.hpp"
#include "dbstrings.hpp"
#include "dbvalidationrecord.hpp"

namespace dbcore {

namespace {

constexpr const char* kFiltersSql =
    "images._id_int_64 IN (SELECT image_id FROM filter_images WHERE filter_id IN "
    "(SELECT value FROM json_each(?)))";
constexpr const char* kVolumeSql =
    "images.folder_path_id IN (SELECT _id_int_64 FROM paths WHERE volume_id_int_64 = ?)";
// The folder itself, or a path in ["path/", "path0"): exactly the texts starting with "path/", since "0"
// is the byte after "/".
constexpr const char* kFolderTreeSql =
    "images.folder_path_id IN (SELECT _id_int_64 FROM paths WHERE volume_id_int_64 = ? AND "
    "(path_wide_ch = ? OR (path_wide_ch >= ? AND path_wide_ch < ?)))";

std::string jsonArray(const std::vector<long long>& ids) {
  std::string json = "[";
  for (const long long id : ids) json += (json.size() > 1 ? "," : "") + std::to_string(id);
  return json + "]";
}

}  // namespace

DBImgSelectQuery::DBImgSelectQuery() : DBEntitySelectQuery(DBImage::kTableName) {}

void DBImgSelectQuery::Filters(std::vector<long long> filterIds) {
  std::sort(filterIds.begin(), filterIds.end());
  filterIds.erase(std::unique(filterIds.begin(), filterIds.end()), filterIds.end());
  filterIds_ = std::move(filterIds);
  rebuild();
}

void DBImgSelectQuery::PathPrefix(std::shared_ptr<DBPath> path) {
  folderTree_.reset();
  if (path) {
    std::wstring text = path->path;
    while (!text.empty() && text.back() == L'/') text.pop_back();
    folderTree_ = FolderTree{path->volume_id, std::move(text)};
  }
  rebuild();
}

void DBImgSelectQuery::join(const std::string& table, std::shared_ptr<DBClause> clause) {
  if (clause && !clause->empty()) {
    joins_[table] = std::move(clause);
  } else {
    joins_.erase(table);
  }
  rebuild();
}

std::vector<std::shared_ptr<token_node>> DBImgSelectQuery::conditionTrees() const {
  std::vector<std::shared_ptr<token_node>> trees = DBEntitySelectQuery::conditionTrees();
  for (const auto& [table, clause] : joins_) trees.push_back(clause->root());
  return trees;
}

uint32_t DBImgSelectQuery::joinedSlots() const {
  uint32_t slots = 0;
  const auto& related = DBValidationRecord::relatedTables(DBImage::kTableName);
  for (std::size_t index = 0; index < related.size(); ++index) {
    if (joins_.count(related[index].table)) slots |= 1u << (index + 1);
  }
  return slots;
}

std::vector<DBSelectRestriction> DBImgSelectQuery::restrictions() const {
  std::vector<DBSelectRestriction> restrictions;
  if (!filterIds_.empty()) restrictions.push_back(filtersRestriction());
  if (folderTree_) restrictions.push_back(folderTreeRestriction());
  return restrictions;
}

DBSelectRestriction DBImgSelectQuery::filtersRestriction() const {
  return {kFiltersSql, {TVariant(jsonArray(filterIds_))}};
}

DBSelectRestriction DBImgSelectQuery::folderTreeRestriction() const {
  const TVariant volume(static_cast<int64_t>(folderTree_->volumeId));
  if (folderTree_->path.empty()) return {kVolumeSql, {volume}};
  const std::string path = ws2s(folderTree_->path);
  return {kFolderTreeSql, {volume, TVariant(path), TVariant(path + "/"), TVariant(path + "0")}};
}

}  // namespace dbcore
