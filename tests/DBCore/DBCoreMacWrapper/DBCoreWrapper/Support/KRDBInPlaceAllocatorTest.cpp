#include "Support/KRDBInPlaceAllocator.hpp"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <type_traits>
#include <utility>

namespace {

// A class built only through its factory, in place next to its reference count.
class KRProtectedThing : public std::enable_shared_from_this<KRProtectedThing> {
 public:
  static std::shared_ptr<KRProtectedThing> make(std::string name, int number) {
    return std::allocate_shared<KRProtectedThing>(KRDBInPlaceAllocator<KRProtectedThing, Builder>(),
                                                  std::move(name), number);
  }
  const std::string& name() const { return name_; }
  int number() const { return number_; }

 protected:
  KRProtectedThing(std::string name, int number) : name_(std::move(name)), number_(number) {}

 private:
  struct Builder {
    template <class U, class... Args>
    static void build(U* place, Args&&... args) {
      ::new (static_cast<void*>(place)) U(std::forward<Args>(args)...);
    }
  };

  std::string name_;
  int number_;
};

static_assert(!std::is_constructible_v<KRProtectedThing, std::string, int>);

TEST(KRDBInPlaceAllocatorTest, BuildsAnObjectWhoseConstructorIsNotPublic) {
  const auto thing = KRProtectedThing::make("lens", 35);
  EXPECT_EQ(thing->name(), "lens");
  EXPECT_EQ(thing->number(), 35);
  EXPECT_EQ(thing.use_count(), 1);
}

TEST(KRDBInPlaceAllocatorTest, TheObjectKnowsItsSharedOwner) {
  const auto thing = KRProtectedThing::make("body", 1);
  EXPECT_EQ(thing->shared_from_this(), thing);
  std::weak_ptr<KRProtectedThing> weak = thing;
  EXPECT_FALSE(weak.expired());
}

}  // namespace
