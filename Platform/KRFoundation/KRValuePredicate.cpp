#include "KRFoundation/KRValuePredicate.hpp"

#include "KRFoundation/KRHashing.hpp"

std::shared_ptr<KRValuePredicate> KRValuePredicate::predicateWithValue(bool value) {
  return std::shared_ptr<KRValuePredicate>(new KRValuePredicate(value));
}

bool KRValuePredicate::isEqual(const std::shared_ptr<const KRObject>& other) const {
  const auto predicate = std::dynamic_pointer_cast<const KRValuePredicate>(other);
  return predicate && predicate->value_ == value_;
}

uint64_t KRValuePredicate::hash() const { return KRHashing::mix(value_ ? 1 : 0); }
