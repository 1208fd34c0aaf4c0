#pragma once

#include "KRFoundation/KRPredicate.hpp"

// A predicate that calls a block with the evaluated object and the bindings. Equal only to itself; its
// format "BLOCKPREDICATE(0x...)" names it and does not parse. Thread safety is the block's.
class KRBlockPredicate : public KRPredicate {
 public:
  // Raises NSInvalidArgumentException for an empty block.
  static std::shared_ptr<KRBlockPredicate> predicateWithBlock(Block block);

  std::string predicateFormat() const override;

 protected:
  bool evaluate(const KRValue& object, const KRDictionary& bindings) const override;

 private:
  explicit KRBlockPredicate(Block block) : block_(std::move(block)) {}
  const Block block_;
};
