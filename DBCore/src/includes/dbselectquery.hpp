#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "dbclause.hpp"
#include "dbentity.hpp"
#include "tvariant.hpp"

namespace dbcore {

class DBSelectPlan;
class DBSqlRow;
class DBValidationRecord;

// Gives the record of a related table that belongs to a record (for an image: its user attributes in
// "image_user_attributes", its exif attributes in "image_exiv_attributes"), or an empty pointer when it
// has none. Called from any thread: it must be thread-safe and must not call the engine.
using DBRelatedRecordResolver =
    std::function<std::shared_ptr<DBEntity>(const DBEntity& record, const std::string& relatedTable)>;

// A condition of a query beyond its clauses (an SQL expression of the engine's own) and the values of its
// parameters, in order.
struct DBSelectRestriction {
  std::string sql;
  std::vector<TVariant> parameters;
};

// The column of Result's map that tells whether the record satisfies the query (a T_BOOL value).
inline constexpr const char* kSelectResultColumn = "result_bool";

// A select query over the records of one table, run by DBReactor::GetBySelectQuery<T> (records ordered
// by _id_int_64) and evaluated in memory on validation records with the same answers.
//
// Configure a query (Where, the subclasses' settings, setRelatedRecordResolver) before handing it to
// other threads; afterwards validationRecordForEntity and Result may be called from any number of
// threads at once, also while the engine runs the query.
//
// Conditions: Where takes a clause (DBClause, see clauseWithCondition) over the table's columns; an
// empty clause restricts nothing. A clause that names an unknown table or column, or is otherwise
// malformed, makes the whole query select nothing (DBClauseCompiler). Max/min sub-selects
// ("max_from_column") are evaluated by SQL when the query runs; in memory they take the values read when
// the engine last ran the query (NULL before it first ran, so that comparisons with them are unknown).
//
// A plain DBEntitySelectQuery has no table: it selects from the table of the record type it is run
// for, and its Result is always false. The subclasses name their table.
class DBEntitySelectQuery {
 public:
  DBEntitySelectQuery();
  virtual ~DBEntitySelectQuery();
  DBEntitySelectQuery(const DBEntitySelectQuery&) = delete;
  DBEntitySelectQuery& operator=(const DBEntitySelectQuery&) = delete;

  void Where(std::shared_ptr<DBClause> clause);

  // Tells validationRecordForEntity where to find the related records of a record (the user and exif
  // attributes of an image). Without it, an image's validation record has no related rows, so that it
  // satisfies no query that joins attributes.
  void setRelatedRecordResolver(DBRelatedRecordResolver resolver);

  // The record's values for in-memory tests: its own columns and, through the resolver, its related
  // records'. It does not depend on this query and serves every query over the record's table. Empty
  // for an empty entity. Takes no database access.
  std::shared_ptr<const DBValidationRecord> validationRecordForEntity(std::shared_ptr<DBEntity> entity) const;

  // Whether the record satisfies the query's conditions: Where and the joins (with their requirement
  // that the related rows exist), evaluated as SQLite evaluates them. Restrictions that are not clauses
  // (DBImgSelectQuery's Filters and PathPrefix) are not part of the answer: the object layer tests them
  // on its entities. A record of another table, an empty record or a query that selects nothing gives
  // false. The answer is returned and also stored in `resultMap` under kSelectResultColumn (other
  // entries are left as they are). Thread-safe; allocates nothing once the map holds the entry.
  bool Result(ColumnValues& resultMap, const std::shared_ptr<const DBValidationRecord>& record) const;

  // The table the query selects from; empty for a plain DBEntitySelectQuery.
  const std::string& table() const { return table_; }

  // For the engine: the plan reading records of `table`: the query's own, one made for the call when
  // the query has no table, or null when the query selects from another table.
  std::shared_ptr<const DBSelectPlan> planFor(const std::string& table) const;

  // For the engine: keeps the values of the plan's max/min sub-selects, read when the query ran, for
  // Result, in place of those kept before. Ignored unless the plan is the query's current one.
  void keepAggregates(const std::shared_ptr<const DBSelectPlan>& plan, DBSqlRow values);

 protected:
  explicit DBEntitySelectQuery(std::string table);

  // Remakes the plan from the current settings; every setter calls it.
  void rebuild();

  // The condition trees of the query: the Where clause's and the subclass's own.
  virtual std::vector<std::shared_ptr<token_node>> conditionTrees() const;
  // Related tables joined whatever the conditions read (bit n: related table n).
  virtual uint32_t joinedSlots() const { return 0; }
  virtual std::vector<DBSelectRestriction> restrictions() const;

 private:
  // Sub-select values with the plan they were read for.
  struct AggregateSnapshot;

  std::shared_ptr<const DBSelectPlan> makePlan(const std::string& table) const;
  bool evaluate(const DBValidationRecord& record) const;

  std::string table_;
  std::shared_ptr<DBClause> where_;
  DBRelatedRecordResolver resolver_;
  std::shared_ptr<const DBSelectPlan> plan_;
  // The snapshot Result reads. A reader holds the one it loaded while it evaluates, so a new snapshot
  // may replace it at any time and the query keeps only the current one.
  std::atomic<std::shared_ptr<const AggregateSnapshot>> aggregates_;
};

}  // namespace dbcore
