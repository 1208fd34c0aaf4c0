#pragma once

#include <memory>

#include "KRFoundation/KRComparisonOperator.hpp"
#include "KRFoundation/KRExpression.hpp"
#include "KRFoundation/KRPredicate.hpp"

// "left operator right": both expressions are evaluated on the object, then compared by the operator
// (KRComparisonOperator). With the ANY or ALL modifier the left value must be an array or a set (nil
// counts as empty) and the operator applies to each of its elements: ANY holds when one element
// satisfies it, ALL when every element does. Another left value raises NSInvalidArgumentException.
class KRComparisonPredicate : public KRPredicate {
 public:
  enum class Modifier { Direct, All, Any };
  using Type = KRComparisonOperator::Type;

  // Raises NSInvalidArgumentException for an empty expression, an invalid constant MATCHES pattern, and a
  // constant BETWEEN bound that is not an array of two values.
  static std::shared_ptr<KRComparisonPredicate> predicateWithLeftExpression(
      std::shared_ptr<KRExpression> left, std::shared_ptr<KRExpression> right, Modifier modifier, Type type,
      unsigned options = 0);

  const std::shared_ptr<KRExpression>& leftExpression() const { return left_; }
  const std::shared_ptr<KRExpression>& rightExpression() const { return right_; }
  Modifier comparisonPredicateModifier() const { return modifier_; }
  Type predicateOperatorType() const { return operator_.type(); }
  unsigned options() const { return operator_.options(); }

  std::string predicateFormat() const override;
  bool isEqual(const std::shared_ptr<const KRObject>& other) const override;
  uint64_t hash() const override;

 protected:
  bool evaluate(const KRValue& object, const KRDictionary& bindings) const override;

 private:
  KRComparisonPredicate(std::shared_ptr<KRExpression> left, std::shared_ptr<KRExpression> right,
                        Modifier modifier, KRComparisonOperator comparisonOperator);
  bool evaluateEach(const KRValue& left, const KRValue& right) const;

  const std::shared_ptr<KRExpression> left_;
  const std::shared_ptr<KRExpression> right_;
  const Modifier modifier_;
  const KRComparisonOperator operator_;
};
