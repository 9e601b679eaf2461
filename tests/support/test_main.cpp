#include <gtest/gtest.h>

#include "tests/support/TestSupport.h"

int main(int argc, char** argv) {
  ::testing::InitGoogleTest(&argc, argv);
  pictavo::test::ensureHomeFolder();
  pictavo::test::installThrowingAssertHandler();
  int result = RUN_ALL_TESTS();
  pictavo::test::shutdownElm();
  return result;
}
