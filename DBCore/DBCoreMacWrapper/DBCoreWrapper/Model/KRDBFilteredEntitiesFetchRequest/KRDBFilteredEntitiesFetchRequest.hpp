#pragma once

#include <cstdint>
#include <memory>
#include <mutex>
#include <string>

#include "KRFoundation/KRObject.hpp"
#include "dbclause.hpp"
#include "dbselectquery.hpp"

class KRDBEntity;

// What fetch requests ask of an entity's context beyond the entity operations: whether it is closing.
// KRDBContext implements it; a context without it is never closing. Called from any thread.
class KRDBClosingEntityContext {
 public:
  virtual ~KRDBClosingEntityContext() = default;
  virtual bool isWaitingForClose() const = 0;
};

// The abstract fetch request: a set of entities of one type, described as an engine select query (built
// on first use and cached until reset) and as an in-memory test that evaluates that query on the
// entity's validation record. Configure a request on one thread; once configured, selectQuery and the
// in-memory test may be called from several threads at once (the cached query is guarded).
class KRDBFilteredEntitiesFetchRequest : public KRObject {
 public:
  using SelectQueryPtr = std::shared_ptr<dbcore::DBEntitySelectQuery>;

  // The text that keeps records marked to delete out of every request.
  static constexpr const char* kNotMarkedToDeleteCondition = "(marked_to_delete_bool == false)";

  // The cached query, made by makeSelectQuery when there is none.
  SelectQueryPtr selectQuery();
  // A new query from the current settings. Abstract: logged and raised here.
  virtual SelectQueryPtr makeSelectQuery();
  // Drops the cached query.
  virtual void reset();
  // The entity type code of the selected entities. Abstract: logged and raised here.
  virtual int64_t entityType() const;
  // Whether the entity belongs to the request: no while its context waits for close or for an entity of
  // another type; otherwise the query's answer on the entity's validation record (taken and stored on the
  // entity when it has none).
  virtual bool isEntitySatisfyingFilterConditions(const std::shared_ptr<KRDBEntity>& entity);

 protected:
  KRDBFilteredEntitiesFetchRequest() = default;

  // The clause of a condition for a record type. A condition that the engine rejects (malformed, of
  // mismatched types) selects nothing rather than everything.
  template <class T>
  static std::shared_ptr<dbcore::DBClause> clauseSelectingNothingWhenRejected(const std::string& condition,
                                                                              bool joined) {
    auto clause = dbcore::clauseWithCondition<T>(condition, joined);
    if (clause.empty()) clause = dbcore::clauseWithCondition<T>(kNothingCondition, joined);
    return std::make_shared<dbcore::DBClause>(std::move(clause));
  }
  // "(marked_to_delete_bool == false)", then " && (condition)" when the condition is not empty.
  static std::string notMarkedToDeleteConditionWith(const std::string& condition);
  // A query of kind Q whose Where is the clause of notMarkedToDeleteConditionWith(condition) over T.
  template <class Q, class T>
  static SelectQueryPtr notMarkedToDeleteQuery(const std::string& condition) {
    auto query = std::make_shared<Q>();
    query->Where(clauseSelectingNothingWhenRejected<T>(notMarkedToDeleteConditionWith(condition), false));
    return query;
  }
  // Raises the unrecognised-operation error of an abstract operation.
  [[noreturn]] void raiseUnrecognizedSelector(const char* operation) const;

 private:
  // A condition no record satisfies.
  static constexpr const char* kNothingCondition =
      "(marked_to_delete_bool == false) && (marked_to_delete_bool == true)";

  std::mutex selectQueryMutex_;
  SelectQueryPtr selectQuery_;
};

using KRDBFilteredEntitiesFetchRequestPtr = std::shared_ptr<KRDBFilteredEntitiesFetchRequest>;
