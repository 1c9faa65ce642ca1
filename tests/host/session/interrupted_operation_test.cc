// Calls to the kernel from a signal handler that interrupts an operation.
#include <sys/prctl.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <string>

#include "host/session/session.h"
#include "kernel/private_call.h"
#include "platform/private_calls.h"
#include "tests/host/session/session_fixture.h"

namespace StandIn {
namespace {

using ZekCtl::Kernel::kLabelAttribute;
using ZekCtl::Kernel::PrivateCall;

constexpr char kOtherAttribute[] = "user.secpolicy.test";

// What a handler was told.
struct Told {
  bool wasAsked = false;
  long status = 0;
  int number = 0;
  int resolving = 0;
  int settingLabel = 0;
  int gettingLabel = 0;
  int gettingOther = 0;
};
Told told;

// Of a failing call.
template <typename Call>
int ErrnoOf(const Call& call) {
  errno = 0;
  return call() == -1 ? errno : 0;
}

void AskFromHandler(int) {
  const int before = errno;
  std::uint32_t count = 0;
  std::uint32_t label = 1;
  std::array<char, 4096> path{};
  told.wasAsked = true;
  errno = 0;
  told.status = SecPolicy::IssuePrivateCall(PrivateCall::kCountRules, 0, &count);
  told.number = errno;
  told.resolving =
      ErrnoOf([&] { return prctl(ZekCtl::Kernel::kPrctlResolvePath, "/", path.data(), 0, 0); });
  told.settingLabel =
      ErrnoOf([&] { return setxattr("/", kLabelAttribute, &label, sizeof label, XATTR_REPLACE); });
  told.gettingLabel = ErrnoOf([&] { return getxattr("/", kLabelAttribute, &label, sizeof label); });
  told.gettingOther =
      ErrnoOf([&] { return getxattr("/none", kOtherAttribute, &label, sizeof label); });
  errno = before;
}

class InterruptedOperationTest : public SessionTest {
 protected:
  void SetUp() override { Assembled(); }

  // Runs `body` in a host; SIGUSR1 comes in the middle of each operation, while the lock is held.
  void Interrupted(const std::function<void(Session&)>& body) const {
    SessionOptions options;
    options.trace = [](const std::string&) { raise(SIGUSR1); };
    InHost(options, [&](Session& session) {
      std::signal(SIGUSR1, AskFromHandler);
      alarm(20);  // a call that waits for its own thread is to fail the test, not to stop it
      body(session);
      EXPECT_TRUE(told.wasAsked);
      EXPECT_EQ(told.status, 0x0bad0000 + EDEADLK);
      EXPECT_EQ(told.number, EDEADLK);
      EXPECT_EQ(told.resolving, EDEADLK);
      EXPECT_EQ(told.settingLabel, EDEADLK);
      EXPECT_EQ(told.gettingLabel, EDEADLK);
      EXPECT_EQ(told.gettingOther, ENOENT);
    });
  }
};

TEST_F(InterruptedOperationTest, CallsWithinATrappedCallAreRefused) {
  Interrupted([](Session&) {
    std::uint32_t id = 0;
    EXPECT_EQ(SecPolicy::IssuePrivateCall(PrivateCall::kCreateDomain, "newDom", 0, &id), 0);
    EXPECT_EQ(id, 1U);
    std::signal(SIGUSR1, SIG_IGN);
    std::uint32_t count = 99;
    EXPECT_EQ(SecPolicy::IssuePrivateCall(PrivateCall::kCountRules, id, &count), 0);
    EXPECT_EQ(count, 0U);
  });
}

TEST_F(InterruptedOperationTest, CallsWithinAnOperationOfTheAccessLibraryAreRefused) {
  Interrupted([](Session& session) {
    EXPECT_EQ(session.Module().FindDomain("rootDom"), 0U);
    std::signal(SIGUSR1, SIG_IGN);
    EXPECT_EQ(session.Module().FindDomain("rootDom"), 0U);
  });
}

TEST_F(InterruptedOperationTest, CallsWithinABatchAreRefused) {
  Interrupted([](Session& session) {
    session.BeginBatch();
    session.Module().CreateDomain("newDom", DomainOrigin::kPolicy);
    session.Commit();
  });
}

}  // namespace
}  // namespace StandIn
