// Feeds arbitrary bytes as a condition to the condition language of the record types that conditions
// are written against. Besides not crashing, a clause must never hold an engine reference that its
// own table and column tables did not make: a literal can never pass for one.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>

#include "dbclause.hpp"
#include "dbenginereference.hpp"
#include "dbrecords.hpp"

namespace {

using dbcore::DBEngineReference;

bool isOwnReference(const DBEngineReference& reference, const std::string& table, bool joined) {
  switch (reference.kind) {
    case DBEngineReference::Kind::Source:
      return !joined && dbcore::DBEntity::T_COLUMN_TYPES(table).count(reference.column) == 1;
    case DBEngineReference::Kind::Other:
      return joined && reference.table == table &&
             dbcore::DBEntity::T_COLUMN_TYPES(table).count(reference.column) == 1;
    case DBEngineReference::Kind::Max:
    case DBEngineReference::Kind::Min:
      return reference.table == table;
  }
  return false;
}

void checkReferences(const std::shared_ptr<dbcore::token_node>& node, const std::string& table, bool joined) {
  if (!node) return;
  if (node->var && node->var->type() == dbcore::FieldType::T_TEXT) {
    const auto reference = DBEngineReference::parse(node->var->asText());
    if (reference && !isOwnReference(*reference, table, joined)) std::abort();
  }
  checkReferences(node->left, table, joined);
  checkReferences(node->right, table, joined);
}

template <class T>
void check(const std::string& condition, bool joined) {
  const dbcore::DBClause clause = dbcore::clauseWithCondition<T>(condition, joined);
  checkReferences(clause.root(), T::kTableName, joined);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
  const std::string condition(reinterpret_cast<const char*>(data), size);
  check<dbcore::DBImage>(condition, false);
  check<dbcore::DBImage>(condition, true);
  check<dbcore::DBUserImgAttrib>(condition, true);
  check<dbcore::DBExivImgAttrib>(condition, true);
  return 0;
}
