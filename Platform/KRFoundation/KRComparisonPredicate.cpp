#include "KRFoundation/KRComparisonPredicate.hpp"

#include <algorithm>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRHashing.hpp"

namespace {

[[noreturn]] void raiseInvalidArgument(const std::string& reason) {
  KRException::raise(KRException::NSInvalidArgumentException, reason);
}

// The right side of BETWEEN, when constant, must be the two bounds.
void validateBounds(KRComparisonOperator::Type type, const KRExpression& right) {
  if (type != KRComparisonOperator::Type::Between ||
      right.expressionType() != KRExpression::Type::ConstantValue) {
    return;
  }
  const KRArray bounds = right.constantValue().array();
  if (bounds.isNil() || bounds.count() != 2) raiseInvalidArgument("BETWEEN needs an array of two bounds");
}

std::vector<KRValue> elementsForModifier(const KRValue& collection) {
  const KRValue::Type type = collection.type();
  if (type != KRValue::Type::Array && type != KRValue::Type::Set && !collection.isNil() &&
      !collection.isNull()) {
    raiseInvalidArgument("The left hand side for an ALL or ANY operator must be either an array or a set");
  }
  return KRComparisonOperator::elements(collection);
}

}  // namespace

std::shared_ptr<KRComparisonPredicate> KRComparisonPredicate::predicateWithLeftExpression(
    std::shared_ptr<KRExpression> left, std::shared_ptr<KRExpression> right, Modifier modifier, Type type,
    unsigned options) {
  if (!left || !right) raiseInvalidArgument("A comparison predicate needs two expressions");
  validateBounds(type, *right);
  KRComparisonOperator comparisonOperator(type, options, right->constantValue());
  return std::shared_ptr<KRComparisonPredicate>(
      new KRComparisonPredicate(std::move(left), std::move(right), modifier, std::move(comparisonOperator)));
}

KRComparisonPredicate::KRComparisonPredicate(std::shared_ptr<KRExpression> left,
                                             std::shared_ptr<KRExpression> right, Modifier modifier,
                                             KRComparisonOperator comparisonOperator)
    : left_(std::move(left)),
      right_(std::move(right)),
      modifier_(modifier),
      operator_(std::move(comparisonOperator)) {}

bool KRComparisonPredicate::evaluate(const KRValue& object, const KRDictionary& bindings) const {
  const KRValue left = left_->expressionValueWithObject(object, bindings);
  const KRValue right = right_->expressionValueWithObject(object, bindings);
  if (modifier_ == Modifier::Direct) return operator_.evaluate(left, right);
  return evaluateEach(left, right);
}

bool KRComparisonPredicate::evaluateEach(const KRValue& left, const KRValue& right) const {
  const std::vector<KRValue> elements = elementsForModifier(left);
  const auto holds = [&](const KRValue& element) { return operator_.evaluate(element, right); };
  if (modifier_ == Modifier::Any) return std::any_of(elements.begin(), elements.end(), holds);
  return std::all_of(elements.begin(), elements.end(), holds);
}

std::string KRComparisonPredicate::predicateFormat() const {
  const char* prefix = modifier_ == Modifier::Any ? "ANY " : modifier_ == Modifier::All ? "ALL " : "";
  return prefix + left_->expressionFormat() + " " + operator_.symbol() + " " + right_->expressionFormat();
}

bool KRComparisonPredicate::isEqual(const std::shared_ptr<const KRObject>& other) const {
  const auto predicate = std::dynamic_pointer_cast<const KRComparisonPredicate>(other);
  return predicate && predicate->modifier_ == modifier_ && predicate->operator_.type() == operator_.type() &&
         predicate->operator_.options() == operator_.options() && predicate->left_->isEqual(left_) &&
         predicate->right_->isEqual(right_);
}

uint64_t KRComparisonPredicate::hash() const {
  uint64_t hash = KRHashing::mix(static_cast<uint64_t>(operator_.type()));
  hash = KRHashing::combine(hash, static_cast<uint64_t>(modifier_) << 8 | operator_.options());
  hash = KRHashing::combine(hash, left_->hash());
  return KRHashing::combine(hash, right_->hash());
}
