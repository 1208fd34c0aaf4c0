#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "KRFoundation/KRObject.hpp"
#include "KRFoundation/KRValue.hpp"

// A condition on an object: parsed from the platform's predicate format, built from a block, a constant
// or other predicates. Predicates are immutable once made, so one predicate may be evaluated from
// several threads at once (as long as the evaluated objects answer their keys thread-safely).
//
// Format syntax (predicateWithFormat), on top of the expression syntax of KRExpression:
// - comparisons: == = != <> < <= =< > >= => and MATCHES (ICU regular expression, whole text), LIKE
//   (* and ? wildcards), BEGINSWITH, ENDSWITH, CONTAINS, IN, BETWEEN {low, high}; string operators and
//   equality take the modifiers [c] (case-insensitive), [d] (diacritic-insensitive) and [cd];
// - ANY/SOME, ALL and NONE before a comparison apply it to each element of a collection on the left;
// - NOT (!) binds tighter than AND (&&), which binds tighter than OR (||); keywords in any case;
// - TRUEPREDICATE and FALSEPREDICATE.
// The semantics of the operators are those of KRComparisonOperator. A format that does not parse raises
// NSInvalidArgumentException naming the byte position of the failure; an invalid constant regular
// expression raises at parse time.
//
// Evaluation reads key paths with KRValue::valueForKeyPath. A key that the object does not know raises
// the unknown-key KRException (NSUnknownKeyException), which evaluateWithObject lets through, as the
// platform does.
class KRPredicate : public KRObject {
 public:
  using Block = std::function<bool(const KRValue& object, const KRDictionary& bindings)>;

  static std::shared_ptr<KRPredicate> predicateWithFormat(const std::string& format,
                                                          std::vector<KRValue> arguments = {});
  static std::shared_ptr<KRPredicate> predicateWithValue(bool value);
  static std::shared_ptr<KRPredicate> predicateWithBlock(Block block);
  static std::shared_ptr<KRPredicate> andPredicateWithSubpredicates(
      std::vector<std::shared_ptr<KRPredicate>> subpredicates);
  static std::shared_ptr<KRPredicate> orPredicateWithSubpredicates(
      std::vector<std::shared_ptr<KRPredicate>> subpredicates);
  static std::shared_ptr<KRPredicate> notPredicateWithSubpredicate(std::shared_ptr<KRPredicate> subpredicate);

  bool evaluateWithObject(const KRValue& object) const;
  // `bindings` gives the values of the $variables of the format.
  bool evaluateWithObject(const KRValue& object, const KRDictionary& bindings) const;
  // A format that parses back to an equal predicate (block predicates and constants without a literal
  // form excepted, see KRExpression::expressionFormat).
  virtual std::string predicateFormat() const = 0;
  std::string description() const final { return predicateFormat(); }

 protected:
  KRPredicate() = default;
  virtual bool evaluate(const KRValue& object, const KRDictionary& bindings) const = 0;
};

using KRPredicatePtr = std::shared_ptr<KRPredicate>;
