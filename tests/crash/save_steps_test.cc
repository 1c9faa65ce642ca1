// Loads that are killed at each step of their save.
#include <gmock/gmock.h>

#include <algorithm>
#include <iostream>

#include "tests/crash/loading_host.h"
#include "tests/crash/save_calls.h"

namespace CrashTest {
namespace {

using testing::EndsWith;

class SaveStepsTest : public LoadingHost {
 protected:
  SaveStepsTest() : LoadingHost(2, 20) {}

  void SetUp() override {
    if (!TracedProcess::IsPermitted()) GTEST_SKIP() << "processes cannot be traced here";
  }

  [[nodiscard]] SaveCalls StartedLoad() const {
    SetState(OldState());
    return SaveCalls([&] { BecomeLoad(); });
  }
};

TEST_F(SaveStepsTest, UndisturbedSaveWritesSyncsRenamesAndSyncs) {
  SaveCalls load = StartedLoad();
  std::vector<std::string> names;
  while (const auto call = load.Next()) {
    // What follows is the process's end, at which a sanitizer may have something to say.
    if (std::count(names.begin(), names.end(), "fsync") < 2) names.push_back(NameOf(*call));
  }
  std::erase_if(names, [](const std::string& name) {
    return name != "open" && name != "write" && name != "fsync" && name != "rename";
  });
  EXPECT_THAT(names, testing::ElementsAre("open", "write", "fsync", "rename", "fsync"));
  EXPECT_EQ(load.ExitStatus(), 0);
  EXPECT_TRUE(State() == NewState());
}

TEST_F(SaveStepsTest, KilledBeforeEachCallUntilTheLockIsGivenUp) {
  bool isRenamed = false;
  std::string name;
  for (int step = 0; name != "lock"; ++step) {
    SaveCalls load = StartedLoad();
    auto call = load.Next();
    for (int i = 0; i < step && call; ++i) {
      isRenamed |= NameOf(*call) == "rename";
      call = load.Next();
    }
    ASSERT_TRUE(call.has_value());
    name = NameOf(*call);
    load.Kill();
    EXPECT_TRUE(State() == (isRenamed ? NewState() : OldState()))
        << "killed before call " << step << ", " << name;
    std::cout << "killed before call " << step << " of the save, " << name << ": the "
              << (isRenamed ? "new" : "old") << " state\n";
    ExpectUsable();
    if (HasFailure()) break;
  }
  EXPECT_TRUE(isRenamed);
}

}  // namespace
}  // namespace CrashTest
