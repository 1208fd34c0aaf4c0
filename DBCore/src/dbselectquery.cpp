#include "dbselectquery.hpp"

#include <utility>

#include "dbclausecompiler.hpp"
#include "dbclauseevaluator.hpp"

namespace dbcore {

DBEntitySelectQuery::DBEntitySelectQuery() = default;

// The virtual calls of rebuild() reach this class's versions here, which describe a subclass that has
// no settings yet.
DBEntitySelectQuery::DBEntitySelectQuery(std::string table) : table_(std::move(table)) { rebuild(); }

DBEntitySelectQuery::~DBEntitySelectQuery() = default;

void DBEntitySelectQuery::Where(std::shared_ptr<DBClause> clause) {
  where_ = std::move(clause);
  rebuild();
}

void DBEntitySelectQuery::setRelatedRecordResolver(DBRelatedRecordResolver resolver) {
  resolver_ = std::move(resolver);
}

std::shared_ptr<const DBValidationRecord> DBEntitySelectQuery::validationRecordForEntity(
    std::shared_ptr<DBEntity> entity) const {
  return entity ? DBValidationRecord::make(*entity, resolver_) : nullptr;
}

bool DBEntitySelectQuery::Result(ColumnValues& resultMap,
                                 const std::shared_ptr<const DBValidationRecord>& record) const {
  bool satisfied = false;
  if (record && plan_ && record->table() == plan_->table()) {
    const AggregateSnapshot* snapshot = aggregates_.load(std::memory_order_acquire);
    const DBClauseEvaluator evaluator(plan_->program(), *record, snapshot ? &snapshot->values : nullptr);
    satisfied = evaluator.satisfied(plan_->joinedSlots());
  }
  static const std::string column = kSelectResultColumn;
  resultMap.insert_or_assign(column, TVariant(satisfied));
  return satisfied;
}

std::shared_ptr<const DBSelectPlan> DBEntitySelectQuery::planFor(const std::string& table) const {
  if (table_.empty()) return makePlan(table);
  return table == table_ ? plan_ : nullptr;
}

void DBEntitySelectQuery::keepAggregates(const std::shared_ptr<const DBSelectPlan>& plan, DBSqlRow values) {
  if (!plan || plan != plan_) return;
  const std::lock_guard<std::mutex> lock(snapshotsMutex_);
  const AggregateSnapshot* current = aggregates_.load(std::memory_order_acquire);
  if (current && current->plan == plan && current->values.holdsSameValues(values)) return;
  snapshots_.push_back(std::make_unique<const AggregateSnapshot>(AggregateSnapshot{plan, std::move(values)}));
  aggregates_.store(snapshots_.back().get(), std::memory_order_release);
}

void DBEntitySelectQuery::rebuild() {
  if (table_.empty()) return;
  plan_ = makePlan(table_);
  aggregates_.store(nullptr, std::memory_order_release);
}

std::vector<std::shared_ptr<token_node>> DBEntitySelectQuery::conditionTrees() const {
  return {where_ ? where_->root() : nullptr};
}

std::shared_ptr<const DBSelectPlan> DBEntitySelectQuery::makePlan(const std::string& table) const {
  DBClauseProgram program = DBClauseCompiler(table).compile(conditionTrees());
  return std::make_shared<const DBSelectPlan>(table, std::move(program), joinedSlots(), restrictions());
}

}  // namespace dbcore
