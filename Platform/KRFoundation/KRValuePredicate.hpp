#pragma once

#include "KRFoundation/KRPredicate.hpp"

// The constant predicates TRUEPREDICATE and FALSEPREDICATE.
class KRValuePredicate : public KRPredicate {
 public:
  static std::shared_ptr<KRValuePredicate> predicateWithValue(bool value);

  bool value() const { return value_; }
  std::string predicateFormat() const override { return value_ ? "TRUEPREDICATE" : "FALSEPREDICATE"; }
  bool isEqual(const std::shared_ptr<const KRObject>& other) const override;
  uint64_t hash() const override;

 protected:
  bool evaluate(const KRValue&, const KRDictionary&) const override { return value_; }

 private:
  explicit KRValuePredicate(bool value) : value_(value) {}
  const bool value_;
};
