#include "KRServices/KRBaseInjectorService.hpp"

#include <gtest/gtest.h>

#include <thread>
#include <vector>

namespace {

// A protocol and two implementation classes of it.
class Greeting {
 public:
  virtual ~Greeting() = default;
  virtual std::string greet() const = 0;
};

class EnglishGreeting : public Greeting {
 public:
  std::string greet() const override { return "hello"; }
};

class FrenchGreeting : public Greeting {
 public:
  std::string greet() const override { return "bonjour"; }
};

// A second, unrelated protocol.
class Counter {
 public:
  virtual ~Counter() = default;
  virtual int count() const = 0;
};

class FixedCounter : public Counter {
 public:
  int count() const override { return 3; }
};

class SubclassInjectorService : public KRBaseInjectorService {};

class KRBaseInjectorServiceTest : public testing::Test {
 protected:
  void TearDown() override {
    KRBaseInjectorService::unbindProtocol<Greeting>();
    KRBaseInjectorService::unbindProtocol<Counter>();
  }
};

TEST_F(KRBaseInjectorServiceTest, UnboundProtocolResolvesToNothing) {
  EXPECT_EQ(KRBaseInjectorService::resolveImplementationClassForProtocol<Greeting>(), nullptr);
}

TEST_F(KRBaseInjectorServiceTest, ResolvesTheBoundImplementation) {
  const auto english = std::make_shared<EnglishGreeting>();
  KRBaseInjectorService::bindProtocol<Greeting>(english);
  const std::shared_ptr<Greeting> resolved =
      KRBaseInjectorService::resolveImplementationClassForProtocol<Greeting>();
  EXPECT_EQ(resolved, english);
  EXPECT_EQ(resolved->greet(), "hello");
}

TEST_F(KRBaseInjectorServiceTest, LaterBindingReplacesTheEarlier) {
  KRBaseInjectorService::bindProtocol<Greeting>(std::make_shared<EnglishGreeting>());
  KRBaseInjectorService::bindProtocol<Greeting>(std::make_shared<FrenchGreeting>());
  EXPECT_EQ(KRBaseInjectorService::resolveImplementationClassForProtocol<Greeting>()->greet(), "bonjour");
}

TEST_F(KRBaseInjectorServiceTest, ProtocolsAreBoundIndependently) {
  KRBaseInjectorService::bindProtocol<Counter>(std::make_shared<FixedCounter>());
  EXPECT_EQ(KRBaseInjectorService::resolveImplementationClassForProtocol<Greeting>(), nullptr);
  EXPECT_EQ(KRBaseInjectorService::resolveImplementationClassForProtocol<Counter>()->count(), 3);
}

TEST_F(KRBaseInjectorServiceTest, UnbindingOrBindingNothingRemovesTheBinding) {
  KRBaseInjectorService::bindProtocol<Greeting>(std::make_shared<EnglishGreeting>());
  KRBaseInjectorService::unbindProtocol<Greeting>();
  EXPECT_EQ(KRBaseInjectorService::resolveImplementationClassForProtocol<Greeting>(), nullptr);
  KRBaseInjectorService::bindProtocol<Greeting>(std::make_shared<EnglishGreeting>());
  KRBaseInjectorService::bindProtocol<Greeting>(nullptr);
  EXPECT_EQ(KRBaseInjectorService::resolveImplementationClassForProtocol<Greeting>(), nullptr);
}

TEST_F(KRBaseInjectorServiceTest, SubclassesShareTheRegistry) {
  SubclassInjectorService::bindProtocol<Greeting>(std::make_shared<FrenchGreeting>());
  EXPECT_EQ(KRBaseInjectorService::resolveImplementationClassForProtocol<Greeting>()->greet(), "bonjour");
  KRBaseInjectorService::bindProtocol<Greeting>(std::make_shared<EnglishGreeting>());
  EXPECT_EQ(SubclassInjectorService::resolveImplementationClassForProtocol<Greeting>()->greet(), "hello");
}

TEST_F(KRBaseInjectorServiceTest, ResolvesWhileAnotherThreadRebinds) {
  const std::shared_ptr<Greeting> english = std::make_shared<EnglishGreeting>();
  const std::shared_ptr<Greeting> french = std::make_shared<FrenchGreeting>();
  KRBaseInjectorService::bindProtocol<Greeting>(english);
  std::vector<std::thread> readers;
  for (int reader = 0; reader < 3; ++reader) {
    readers.emplace_back([&] {
      for (int i = 0; i < 1000; ++i) {
        const auto resolved = KRBaseInjectorService::resolveImplementationClassForProtocol<Greeting>();
        EXPECT_TRUE(resolved == english || resolved == french);
      }
    });
  }
  for (int i = 0; i < 1000; ++i) KRBaseInjectorService::bindProtocol<Greeting>(i % 2 ? french : english);
  for (std::thread& reader : readers) reader.join();
  EXPECT_EQ(KRBaseInjectorService::resolveImplementationClassForProtocol<Greeting>(), french);
}

}  // namespace
