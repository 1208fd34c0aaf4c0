#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <type_traits>
#include <vector>

#include "dbexivimgattrib.hpp"
#include "dbpath.hpp"
#include "dbselectquery.hpp"
#include "dbuserimgattrib.hpp"

namespace dbcore {

// A select query over images ("images"), with restrictions to collections and to a folder tree and
// conditions on the images' user and exif attribute records.
//
// Result covers Where and the joins only; the object layer tests Filters and PathPrefix on its
// entities itself.
class DBImgSelectQuery : public DBEntitySelectQuery {
 public:
  DBImgSelectQuery();

  // Images in at least one of the collections (by id):
  //   images._id_int_64 IN (SELECT image_id FROM filter_images WHERE filter_id IN
  //                         (SELECT value FROM json_each(?)))
  // with the ids bound as one JSON array. An empty list restricts nothing.
  void Filters(std::vector<long long> filterIds);

  // Images whose folder is the path's folder or lies below it, on the path's volume: same
  // volume_id_int_64, and path_wide_ch equal to the path or starting with the path and "/" (so /a/bc is
  // not below /a/b). Trailing separators of the path are ignored; an empty path covers the whole volume.
  // Images without a folder do not pass. The path's volume and text are taken now. An empty pointer
  // restricts nothing.
  void PathPrefix(std::shared_ptr<DBPath> path);

  // A condition on the image's record of A (DBUserImgAttrib or DBExivImgAttrib), whose columns the
  // clause names as OTHER_VAL (clauseWithCondition<A>(condition, true)). A non-empty clause joins A's
  // table on image_id_int_64: images without such a record are not selected. An empty clause removes
  // the condition and restricts nothing.
  template <class A>
  void Join(std::shared_ptr<DBClause> clause) {
    static_assert(std::is_same_v<A, DBUserImgAttrib> || std::is_same_v<A, DBExivImgAttrib>,
                  "images join their user or exif attributes");
    join(A::kTableName, std::move(clause));
  }

 protected:
  std::vector<std::shared_ptr<token_node>> conditionTrees() const override;
  uint32_t joinedSlots() const override;
  std::vector<DBSelectRestriction> restrictions() const override;

 private:
  // The folder tree of PathPrefix: a volume and a path without trailing separators.
  struct FolderTree {
    int64_t volumeId;
    std::wstring path;
  };

  void join(const std::string& table, std::shared_ptr<DBClause> clause);
  DBSelectRestriction filtersRestriction() const;
  DBSelectRestriction folderTreeRestriction() const;

  std::vector<long long> filterIds_;
  std::optional<FolderTree> folderTree_;
  // Join clauses by table.
  std::map<std::string, std::shared_ptr<DBClause>> joins_;
};

}  // namespace dbcore
