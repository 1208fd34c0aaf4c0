#include <gtest/gtest.h>

#include "KRFoundation/KRRunLoop.hpp"

// Tests run on the main thread: the thread that runs the main run loop.
int main(int argc, char** argv) {
  KRRunLoop::designateMainThread();
  testing::InitGoogleTest(&argc, argv);
  return RUN_ALL_TESTS();
}
