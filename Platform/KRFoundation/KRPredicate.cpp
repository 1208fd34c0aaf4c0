#include "KRFoundation/KRPredicate.hpp"

#include "KRFoundation/KRBlockPredicate.hpp"
#include "KRFoundation/KRCompoundPredicate.hpp"
#include "KRFoundation/KRPredicateParser.hpp"
#include "KRFoundation/KRValuePredicate.hpp"

std::shared_ptr<KRPredicate> KRPredicate::predicateWithFormat(const std::string& format,
                                                              std::vector<KRValue> arguments) {
  return KRPredicateParser(format, std::move(arguments)).parsePredicate();
}

std::shared_ptr<KRPredicate> KRPredicate::predicateWithValue(bool value) {
  return KRValuePredicate::predicateWithValue(value);
}

std::shared_ptr<KRPredicate> KRPredicate::predicateWithBlock(Block block) {
  return KRBlockPredicate::predicateWithBlock(std::move(block));
}

std::shared_ptr<KRPredicate> KRPredicate::andPredicateWithSubpredicates(
    std::vector<std::shared_ptr<KRPredicate>> subpredicates) {
  return KRCompoundPredicate::andPredicateWithSubpredicates(std::move(subpredicates));
}

std::shared_ptr<KRPredicate> KRPredicate::orPredicateWithSubpredicates(
    std::vector<std::shared_ptr<KRPredicate>> subpredicates) {
  return KRCompoundPredicate::orPredicateWithSubpredicates(std::move(subpredicates));
}

std::shared_ptr<KRPredicate> KRPredicate::notPredicateWithSubpredicate(
    std::shared_ptr<KRPredicate> subpredicate) {
  return KRCompoundPredicate::notPredicateWithSubpredicate(std::move(subpredicate));
}

bool KRPredicate::evaluateWithObject(const KRValue& object) const { return evaluate(object, KRDictionary()); }

bool KRPredicate::evaluateWithObject(const KRValue& object, const KRDictionary& bindings) const {
  return evaluate(object, bindings);
}
