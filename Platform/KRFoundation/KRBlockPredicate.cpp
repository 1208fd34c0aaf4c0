#include "KRFoundation/KRBlockPredicate.hpp"

#include <cstdio>

#include "KRFoundation/KRException.hpp"

std::shared_ptr<KRBlockPredicate> KRBlockPredicate::predicateWithBlock(Block block) {
  if (!block) KRException::raise(KRException::NSInvalidArgumentException, "A block predicate needs a block");
  return std::shared_ptr<KRBlockPredicate>(new KRBlockPredicate(std::move(block)));
}

std::string KRBlockPredicate::predicateFormat() const {
  char address[32];
  std::snprintf(address, sizeof address, "%p", static_cast<const void*>(this));
  return std::string("BLOCKPREDICATE(") + address + ")";
}

bool KRBlockPredicate::evaluate(const KRValue& object, const KRDictionary& bindings) const {
  return block_(object, bindings);
}
