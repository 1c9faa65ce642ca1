// crash_test [--long] [the framework's own arguments]
#include <gtest/gtest.h>
#include <sys/prctl.h>

#include <iostream>
#include <string_view>

#include "tests/crash/amount.h"

namespace CrashTest {

namespace {

Amount amount = Amount::kShort;

}  // namespace

Amount AmountOfWork() { return amount; }

}  // namespace CrashTest

int main(int argc, char** argv) {
  testing::InitGoogleTest(&argc, argv);
  for (int i = 1; i < argc; ++i) {
    if (std::string_view(argv[i]) != "--long") {
      std::cerr << "usage: crash_test [--long]\n";
      return 2;
    }
    CrashTest::amount = CrashTest::Amount::kLong;
  }
  // Children of a killed process become this one's, so that their end can be waited for.
  prctl(PR_SET_CHILD_SUBREAPER, 1);
  return RUN_ALL_TESTS();
}
