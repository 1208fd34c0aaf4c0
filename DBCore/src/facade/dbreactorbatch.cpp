#include "dbreactor.hpp"

#include "dbconnection.hpp"

// Grouping of facade calls under one commit.

namespace dbcore {

void DBReactor::Batch(const std::function<void()>& body) { connection().commitTogether(body); }

}  // namespace dbcore
