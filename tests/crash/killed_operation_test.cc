// Processes that keep each operation by itself, and are killed at random moments.
#include <fcntl.h>
#include <gmock/gmock.h>
#include <unistd.h>

#include <atomic>
#include <filesystem>
#include <iostream>

#include "host/session/session.h"
#include "secpolicy/secpolicy.h"
#include "tests/crash/amount.h"
#include "tests/crash/loading_host.h"
#include "tests/crash/moments.h"
#include "tests/crash/process_tree.h"
#include "tests/crash/save_calls.h"
#include "tests/crash/shared_memory.h"

namespace CrashTest {
namespace {

using StandIn::UniqueFd;

// Makes the file, writes, syncs, renames, syncs, closes twice, opens, and asks for the version.
constexpr int kCallsOfASave = 9;

class KilledOperationTest : public LoadingHost {
 protected:
  KilledOperationTest() : LoadingHost(3, 8) {
    std::filesystem::create_directory(Path("states"));
    RecordStates();
  }

  // Loads the policy in this process, without a batch. `begun` is called before each operation is
  // kept, when those before it have been.
  void LoadInPieces(const std::function<void()>& begun) const {
    const UniqueFd null(open("/dev/null", O_RDWR | O_CLOEXEC));
    dup2(null.Get(), STDERR_FILENO);
    const StandIn::SessionOptions options{
        .visible = {PolicyDir()}, .trace = [&](const std::string&) { begun(); }, .faults = {}};
    StandIn::Session session(StandIn::HostDirectory(Host()), options);
    SecPolicy::LoadPolicy(PolicyDir());
  }

  // The same, counting the operations that were kept.
  [[noreturn]] void BecomeLoad() const {
    LoadInPieces([&] { ++*kept_; });
    ++*kept_;
    _exit(0);
  }

  // Back to where nothing of the load has been done.
  void StartAnew() const {
    SetState(OldState());
    *kept_ = -1;
  }

  // Expects the state after the operations that reported success, or after one more.
  void ExpectStateAfterKept() {
    const auto kept = static_cast<std::size_t>(std::max(0, kept_->load()));
    const std::string state = State();
    const std::string& next = states_[std::min(kept + 1, states_.size() - 1)];
    ASSERT_TRUE(state == states_[kept] || state == next) << "after " << kept << " operations:\n"
                                                         << state;
    found_.insert(state);
  }

  [[nodiscard]] std::size_t Operations() const { return states_.size() - 1; }
  [[nodiscard]] int Kept() const { return *kept_; }
  [[nodiscard]] std::size_t DifferentStatesFound() const { return found_.size(); }

  // The numbers of the calls, from that which begins the first save, that begin a save.
  [[nodiscard]] std::vector<int> FirstCallsOfSaves() const {
    StartAnew();
    SaveCalls load([&] { BecomeLoad(); });
    std::vector<int> first;
    for (int number = 0; const auto call = load.Next(); ++number) {
      if (BeginsSave(*call)) first.push_back(number);
    }
    return first;
  }

  // Kills a load at the call of that number.
  void KillAtCall(int number) const {
    StartAnew();
    SaveCalls load([&] { BecomeLoad(); });
    for (int i = 0; i <= number; ++i) static_cast<void>(load.Next());
    load.Kill();
  }

 private:
  // states_[n] becomes the state after n operations of an undisturbed load.
  void RecordStates() {
    const UniqueFd host(open(Host().c_str(), O_PATH | O_CLOEXEC));
    const UniqueFd states(open(Path("states").c_str(), O_PATH | O_CLOEXEC));
    SetState(OldState());
    ProcessTree load([&] {
      int number = 0;
      // Each is a file of its own, so that a second name keeps it.
      const auto keep = [&] {
        linkat(host.Get(), "kernel.json", states.Get(), std::to_string(number++).c_str(), 0);
      };
      LoadInPieces(keep);
      keep();
      _exit(0);
    });
    EXPECT_EQ(load.Wait(), 0);
    for (int n = 0; std::filesystem::exists(Path("states/") + std::to_string(n)); ++n) {
      states_.push_back(StandIn::ReadBytes(Path("states/") + std::to_string(n)));
    }
  }

  Shared<std::atomic<int>> kept_;
  std::set<std::string> found_;
  std::vector<std::string> states_;
};

TEST_F(KilledOperationTest, NothingThatReportedSuccessIsLost) {
  ASSERT_GT(Operations(), 50U);
  EXPECT_TRUE(OldState() != NewState());
  StartAnew();
  Moments moments(UndisturbedRun([&] { BecomeLoad(); }));
  int unfinished = 0;
  int during = 0;
  const int kills = Either(30, 400);
  for (int kill = 0; kill < kills && !HasFailure(); ++kill) {
    StartAnew();
    ProcessTree load([&] { BecomeLoad(); });
    moments.Pause();
    load.Kill();
    unfinished += Kept() < static_cast<int>(Operations()) ? 1 : 0;
    during += LeftOver().empty() ? 0 : 1;
    ExpectStateAfterKept();
    ExpectUsable();
  }
  std::cout << kills << " kills of a load of " << Operations()
            << " operations kept one by one: " << unfinished << " before its end, " << during
            << " of them in a save; " << DifferentStatesFound() << " different states were found\n";
  EXPECT_GT(unfinished, 0);
}

// The first save, one in the middle and the last, each at each of its calls.
TEST_F(KilledOperationTest, KilledAtEachCallOfASave) {
  if (!TracedProcess::IsPermitted()) GTEST_SKIP() << "processes cannot be traced here";
  const std::vector<int> saves = FirstCallsOfSaves();
  ASSERT_GT(saves.size(), 20U);
  for (const int first : {saves.front(), saves[saves.size() / 2], saves.back()}) {
    for (int call = first; call < first + kCallsOfASave && !HasFailure(); ++call) {
      KillAtCall(call);
      ExpectStateAfterKept();
      ExpectUsable();
    }
  }
}

}  // namespace
}  // namespace CrashTest
