#pragma once

#include <vector>

#include "KRFoundation/KRPredicate.hpp"

// NOT, AND and OR over subpredicates. AND and OR evaluate their subpredicates in order and stop at the
// first that decides: an empty AND is true and an empty OR false. The format puts AND and OR
// subpredicates in parentheses so that it parses back to the same tree.
class KRCompoundPredicate : public KRPredicate {
 public:
  enum class Type { Not, And, Or };

  // Raise NSInvalidArgumentException for a type other than NOT, AND and OR, for an empty subpredicate,
  // and for NOT without exactly one.
  static std::shared_ptr<KRCompoundPredicate> predicateWithType(Type type,
                                                                std::vector<KRPredicatePtr> subpredicates);
  static std::shared_ptr<KRCompoundPredicate> andPredicateWithSubpredicates(
      std::vector<KRPredicatePtr> subpredicates);
  static std::shared_ptr<KRCompoundPredicate> orPredicateWithSubpredicates(
      std::vector<KRPredicatePtr> subpredicates);
  static std::shared_ptr<KRCompoundPredicate> notPredicateWithSubpredicate(KRPredicatePtr subpredicate);

  Type compoundPredicateType() const { return type_; }
  const std::vector<KRPredicatePtr>& subpredicates() const { return subpredicates_; }
  std::string predicateFormat() const override;
  bool isEqual(const std::shared_ptr<const KRObject>& other) const override;
  uint64_t hash() const override;

 protected:
  bool evaluate(const KRValue& object, const KRDictionary& bindings) const override;

 private:
  KRCompoundPredicate(Type type, std::vector<KRPredicatePtr> subpredicates)
      : type_(type), subpredicates_(std::move(subpredicates)) {}
  std::string subpredicateFormat(const KRPredicate& subpredicate) const;

  const Type type_;
  const std::vector<KRPredicatePtr> subpredicates_;
};
