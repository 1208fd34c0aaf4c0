#include "KRFoundation/KRCompoundPredicate.hpp"

#include <algorithm>
#include <string>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRHashing.hpp"

namespace {

bool isKnownType(KRCompoundPredicate::Type type) {
  using Type = KRCompoundPredicate::Type;
  return type == Type::Not || type == Type::And || type == Type::Or;
}

}  // namespace

std::shared_ptr<KRCompoundPredicate> KRCompoundPredicate::predicateWithType(
    Type type, std::vector<KRPredicatePtr> subpredicates) {
  if (!isKnownType(type)) {
    KRException::raise(KRException::NSInvalidArgumentException,
                       "Unknown compound predicate type " + std::to_string(static_cast<int>(type)));
  }
  if (std::find(subpredicates.begin(), subpredicates.end(), nullptr) != subpredicates.end()) {
    KRException::raise(KRException::NSInvalidArgumentException,
                       "A compound predicate has an empty subpredicate");
  }
  if (type == Type::Not && subpredicates.size() != 1) {
    KRException::raise(KRException::NSInvalidArgumentException,
                       "A NOT predicate takes exactly one subpredicate");
  }
  return std::shared_ptr<KRCompoundPredicate>(new KRCompoundPredicate(type, std::move(subpredicates)));
}

std::shared_ptr<KRCompoundPredicate> KRCompoundPredicate::andPredicateWithSubpredicates(
    std::vector<KRPredicatePtr> subpredicates) {
  return predicateWithType(Type::And, std::move(subpredicates));
}

std::shared_ptr<KRCompoundPredicate> KRCompoundPredicate::orPredicateWithSubpredicates(
    std::vector<KRPredicatePtr> subpredicates) {
  return predicateWithType(Type::Or, std::move(subpredicates));
}

std::shared_ptr<KRCompoundPredicate> KRCompoundPredicate::notPredicateWithSubpredicate(
    KRPredicatePtr subpredicate) {
  return predicateWithType(Type::Not, {std::move(subpredicate)});
}

bool KRCompoundPredicate::evaluate(const KRValue& object, const KRDictionary& bindings) const {
  const auto holds = [&](const KRPredicatePtr& subpredicate) {
    return subpredicate->evaluateWithObject(object, bindings);
  };
  switch (type_) {
    case Type::Not:
      return !holds(subpredicates_.front());
    case Type::And:
      return std::all_of(subpredicates_.begin(), subpredicates_.end(), holds);
    case Type::Or:
      return std::any_of(subpredicates_.begin(), subpredicates_.end(), holds);
  }
  return false;
}

std::string KRCompoundPredicate::predicateFormat() const {
  if (type_ == Type::Not) return "NOT " + subpredicateFormat(*subpredicates_.front());
  if (subpredicates_.empty()) return type_ == Type::And ? "TRUEPREDICATE" : "FALSEPREDICATE";
  if (subpredicates_.size() == 1) return subpredicates_.front()->predicateFormat();
  const char* separator = type_ == Type::And ? " AND " : " OR ";
  std::string format;
  for (const KRPredicatePtr& subpredicate : subpredicates_) {
    if (!format.empty()) format += separator;
    format += subpredicateFormat(*subpredicate);
  }
  return format;
}

std::string KRCompoundPredicate::subpredicateFormat(const KRPredicate& subpredicate) const {
  const auto* compound = dynamic_cast<const KRCompoundPredicate*>(&subpredicate);
  const bool grouped = compound && compound->type_ != Type::Not;
  const std::string format = subpredicate.predicateFormat();
  return grouped ? std::string("(").append(format).append(")") : format;
}

bool KRCompoundPredicate::isEqual(const std::shared_ptr<const KRObject>& other) const {
  const auto predicate = std::dynamic_pointer_cast<const KRCompoundPredicate>(other);
  if (!predicate || predicate->type_ != type_ || predicate->subpredicates_.size() != subpredicates_.size()) {
    return false;
  }
  return std::equal(subpredicates_.begin(), subpredicates_.end(), predicate->subpredicates_.begin(),
                    [](const KRPredicatePtr& a, const KRPredicatePtr& b) { return a->isEqual(b); });
}

uint64_t KRCompoundPredicate::hash() const {
  uint64_t hash = KRHashing::mix(static_cast<uint64_t>(type_) + 0x636f6d70ULL);
  for (const KRPredicatePtr& subpredicate : subpredicates_)
    hash = KRHashing::combine(hash, subpredicate->hash());
  return hash;
}
