#pragma once

#include <memory>
#include <utility>

#include "KRFoundation/KRObject.hpp"
#include "KRFoundation/KRValue.hpp"

// Carries a shared object that is not a KRObject (a set of entities, an identifier-keyed map) inside a
// KRValue, so that it travels in info dictionaries without its elements being copied. The box is
// immutable; the held object is shared, not copied. Any thread.
template <class T>
class KRDBValueBox : public KRObject {
 public:
  explicit KRDBValueBox(std::shared_ptr<T> held) : held_(std::move(held)) {}

  // A value holding a box of the object; nil for an empty pointer.
  static KRValue valueWith(std::shared_ptr<T> held) {
    if (!held) return KRValue();
    return KRValue(std::make_shared<KRDBValueBox>(std::move(held)));
  }
  // The object boxed in the value; empty when the value holds no box of this type.
  static std::shared_ptr<T> heldBy(const KRValue& value) {
    const auto box = value.objectAs<KRDBValueBox>();
    return box ? box->held_ : nullptr;
  }

  const std::shared_ptr<T>& held() const { return held_; }

 private:
  std::shared_ptr<T> held_;
};
