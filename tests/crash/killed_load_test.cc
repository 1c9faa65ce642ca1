// Loads that are killed at random moments.
#include <gmock/gmock.h>
#include <poll.h>
#include <sys/inotify.h>

#include <iostream>
#include <stdexcept>

#include "host/files/unique_fd.h"
#include "tests/crash/amount.h"
#include "tests/crash/loading_host.h"
#include "tests/crash/moments.h"

namespace CrashTest {
namespace {

// Notices when a save begins.
class SaveWatch {
 public:
  explicit SaveWatch(const std::string& host) : fd_(inotify_init1(IN_CLOEXEC)) {
    inotify_add_watch(fd_.Get(), host.c_str(), IN_CREATE | IN_ONLYDIR);
  }

  void Wait() const {
    pollfd event{.fd = fd_.Get(), .events = POLLIN, .revents = 0};
    if (poll(&event, 1, 10000) != 1) throw std::runtime_error("no save was seen");
  }

 private:
  StandIn::UniqueFd fd_;
};

class KilledLoadTest : public LoadingHost {
 protected:
  KilledLoadTest() : LoadingHost(20, 60) {}

  // Starts a load, kills it when `wait` returns, and judges what is left.
  void KillAfter(const std::function<void()>& wait) {
    SetState(OldState());
    ProcessTree load([&] { BecomeLoad(); });
    wait();
    load.Kill();
    const std::string state = State();
    const bool isOld = state == OldState();
    ASSERT_TRUE(isOld || state == NewState()) << state;
    ++(!LeftOver().empty() ? during_ : isOld ? before_ : after_);
    old_ += isOld ? 1 : 0;
    ExpectUsable();
  }

  void Report() const {
    const int kills = before_ + during_ + after_;
    std::cout << kills << " kills of a load: " << before_ << " before its save, " << during_
              << " in it, " << after_ << " after it; found the old state " << old_
              << " times, the new one " << kills - old_ << " times\n";
  }

  int before_ = 0;
  int during_ = 0;
  int after_ = 0;

 private:
  int old_ = 0;
};

TEST_F(KilledLoadTest, AtAnyMomentItLeavesTheOldPolicyOrTheNewOne) {
  SetState(OldState());
  Moments moments(UndisturbedRun([&] { BecomeLoad(); }));
  for (int kill = 0; kill < Either(30, 350) && !HasFailure(); ++kill) {
    KillAfter([&] { moments.Pause(); });
  }
  Report();
  EXPECT_GT(before_, 0);
}

// A save is short beside the load; so some are killed from its beginning on.
TEST_F(KilledLoadTest, AtAnyMomentOfItsSaveItLeavesTheOldPolicyOrTheNewOne) {
  Moments moments(Microseconds(2000));
  for (int kill = 0; kill < Either(30, 250) && !HasFailure(); ++kill) {
    const SaveWatch watch(Host());
    KillAfter([&] {
      watch.Wait();
      moments.Pause();
    });
  }
  Report();
  EXPECT_GE(during_, Either(0, 1));
  EXPECT_EQ(before_, 0);
}

}  // namespace
}  // namespace CrashTest
