#include "dbselectquery.hpp"

#include <utility>

#include "dbclausecompiler.hpp"
#include "dbclauseevaluator.hpp"
#include "dbselectplan.hpp"
#include "dbsqlrow.hpp"
#include "dbvalidationrecord.hpp"

namespace dbcore {

struct DBEntitySelectQuery::AggregateSnapshot {
  std::shared_ptr<const DBSelectPlan> plan;
  DBSqlRow values;
};

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
    satisfied = evaluate(*record);
  }
  static const std::string column = kSelectResultColumn;
  resultMap.insert_or_assign(column, TVariant(satisfied));
  return satisfied;
}

std::shared_ptr<const DBSelectPlan> DBEntitySelectQuery::planFor(const std::string& table) const {
  if (table_.empty()) return makePlan(table);
  return table == table_ ? plan_ : nullptr;
}

// Only a program with sub-selects reads the snapshot, so that the others never touch its reference count.
bool DBEntitySelectQuery::evaluate(const DBValidationRecord& record) const {
  const DBClauseProgram& program = plan_->program();
  std::shared_ptr<const AggregateSnapshot> snapshot;
  if (!program.aggregateTypes().empty()) snapshot = aggregates_.load(std::memory_order_acquire);
  const DBClauseEvaluator evaluator(program, record, snapshot ? &snapshot->values : nullptr);
  return evaluator.satisfied(plan_->joinedSlots());
}

void DBEntitySelectQuery::keepAggregates(const std::shared_ptr<const DBSelectPlan>& plan, DBSqlRow values) {
  if (!plan || plan != plan_) return;
  const auto current = aggregates_.load(std::memory_order_acquire);
  if (current && current->plan == plan && current->values.holdsSameValues(values)) return;
  aggregates_.store(std::make_shared<const AggregateSnapshot>(AggregateSnapshot{plan, std::move(values)}),
                    std::memory_order_release);
}

void DBEntitySelectQuery::rebuild() {
  if (table_.empty()) return;
  plan_ = makePlan(table_);
  aggregates_.store(nullptr, std::memory_order_release);
}

std::vector<DBSelectRestriction> DBEntitySelectQuery::restrictions() const { return {}; }

std::vector<std::shared_ptr<token_node>> DBEntitySelectQuery::conditionTrees() const {
  return {where_ ? where_->root() : nullptr};
}

std::shared_ptr<const DBSelectPlan> DBEntitySelectQuery::makePlan(const std::string& table) const {
  DBClauseProgram program = DBClauseCompiler(table).compile(conditionTrees());
  return std::make_shared<const DBSelectPlan>(table, std::move(program), joinedSlots(), restrictions());
}

}  // namespace dbcore
