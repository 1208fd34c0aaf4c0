#include "dbstatementlease.hpp"

#include <utility>

namespace dbcore {

DBStatementLease::DBStatementLease(DBStatement& statement) : statement_(&statement) { statement.lend(); }

DBStatementLease::~DBStatementLease() {
  if (statement_) statement_->giveBack();
}

DBStatementLease::DBStatementLease(DBStatementLease&& other) noexcept
    : statement_(std::exchange(other.statement_, nullptr)) {}

}  // namespace dbcore
