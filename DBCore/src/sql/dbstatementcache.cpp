#include "dbstatementcache.hpp"

#include <iterator>
#include <utility>

namespace dbcore {

DBStatement& DBStatementCache::statement(const DBStaticSql& sql) {
  if (sql.slot() >= fixed_.size()) fixed_.resize(sql.slot() + 1);
  auto& slot = fixed_[sql.slot()];
  if (!slot) slot = std::make_unique<DBStatement>(db_, sql.text());
  return *slot;
}

DBStatement& DBStatementCache::statement(const std::string& sql) {
  const auto found = generatedByText_.find(sql);
  if (found != generatedByText_.end()) {
    generated_.splice(generated_.begin(), generated_, found->second);
    return *found->second->second;
  }
  auto statement = std::make_unique<DBStatement>(db_, sql);
  generated_.emplace_front(sql, std::move(statement));
  generatedByText_.emplace(sql, generated_.begin());
  evictUnused();
  return *generated_.front().second;
}

// Drops the least recently used statements beyond the capacity, passing over those that are lent.
void DBStatementCache::evictUnused() {
  auto candidate = std::prev(generated_.end());
  while (generated_.size() > kGeneratedCapacity && candidate != generated_.begin()) {
    const auto previous = std::prev(candidate);
    if (!candidate->second->leased()) {
      generatedByText_.erase(candidate->first);
      generated_.erase(candidate);
    }
    candidate = previous;
  }
}

void DBStatementCache::clear() {
  generatedByText_.clear();
  generated_.clear();
  fixed_.clear();
}

}  // namespace dbcore
