// The gate and the process that enters it: children, threads, signals, and where it cannot be had.
#include "host/gate/gate.h"

#include <seccomp.h>
#include <sys/syscall.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <csignal>
#include <fstream>
#include <future>
#include <stdexcept>
#include <thread>

#include "host/attached_host.h"
#include "host/root/image_index.h"
#include "host/trace/observed_module.h"
#include "secpolicy/host/host_error.h"
#include "tests/host/gate/gate_fixture.h"
#include "tests/host/module/module_fixture.h"

namespace StandIn {
namespace {

using GateProcessTest = GateTest;

std::uint32_t CountOfRules() {
  std::uint32_t count = 99;
  EXPECT_EQ(Ask(PrivateCall::kCountRules, 0, &count), "done");
  return count;
}

TEST_F(GateProcessTest, ChildrenByForkAskTheSameKernel) {
  InHost([] {
    InChild([] {
      std::uint32_t id = 0;
      EXPECT_EQ(Ask(PrivateCall::kCreateDomain, "childDom", 0, &id), "done");
      EXPECT_EQ(Ask(PrivateCall::kWorldDomain, getpid(), &id), "done");
    });
    std::uint32_t id = 0;
    EXPECT_EQ(Ask(PrivateCall::kCreateDomain, "childDom", 0, &id), "0xbad0011 EEXIST");
    EXPECT_EQ(SecPolicy::GetDomainNameForID(1), "childDom");
  });
}

TEST_F(GateProcessTest, DomainOfAnEndedChildIsLeaked) {
  InHost([] {
    ASSERT_TRUE(ChildPassed(StartChild([] { SecPolicy::CreateDomain("childDom"); })));
    SecPolicy::CreateDomain("ownDom");
    unsigned int count = 0;
    unsigned int ids[2] = {};
    SecPolicy::RetrieveLeakedDomains(2, ids, &count);
    EXPECT_EQ(count, 1u);
    EXPECT_EQ(ids[0], 1u);
  });
}

// The line of this process's status that counts its filters.
std::string FiltersOfThisProcess() {
  std::ifstream status("/proc/self/status");
  std::string line;
  while (std::getline(status, line) && !line.starts_with("Seccomp_filters:")) continue;
  return line;
}

TEST_F(GateProcessTest, EnteringAgainDoesNothing) {
  BehindTheGate([] {
    const std::string filters = FiltersOfThisProcess();
    EXPECT_NE(filters, "");
    EnterGate();
    EXPECT_EQ(FiltersOfThisProcess(), filters);
  });
}

TEST_F(GateProcessTest, ManyTrapsFollowOneAnother) {
  InHost([] {
    for (int i = 0; i < 1000; ++i) ASSERT_EQ(CountOfRules(), 0u);
  });
}

// A host for a process that keeps its root directory.
class HostInPlace {
 public:
  HostInPlace() { Attach(&attached_); }
  ~HostInPlace() { Attach(nullptr); }

 private:
  FakeProcessTable processes_;
  SimulatedModule module_{ReadDescription(DefaultDescriptionText(), "host.json"), processes_};
  OperationPoint point_;
  ObservedModule observed_{module_, point_};
  RootIndex files_{ImageIndex{}, UniqueFd()};
  AttachedHost attached_{observed_, point_, module_, files_};
};

TEST_F(GateProcessTest, ThreadsOfBeforeAndOfAfterHaveTheGate) {
  InChild([] {
    std::promise<void> entered;
    std::thread before([&] {
      entered.get_future().wait();
      EXPECT_EQ(CountOfRules(), 0u);
    });
    EnterGate();
    const HostInPlace host;
    entered.set_value();
    before.join();
    std::thread([] { EXPECT_EQ(CountOfRules(), 0u); }).join();
  });
}

TEST_F(GateProcessTest, SignalThatWasBlockedOrIgnoredIsAnswered) {
  InChild([] {
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGSYS);
    sigprocmask(SIG_BLOCK, &signals, nullptr);
    std::signal(SIGSYS, SIG_IGN);
    EnterGate();
    const HostInPlace host;
    EXPECT_EQ(CountOfRules(), 0u);
  });
}

// Has the kernel answer the call `number` with `error`, 0 for a success, without doing anything.
void AnswerInstead(int number, unsigned int error) {
  scmp_filter_ctx filter = seccomp_init(SCMP_ACT_ALLOW);
  if (seccomp_rule_add(filter, SCMP_ACT_ERRNO(error), number, 0) != 0 ||
      seccomp_load(filter) != 0) {
    throw std::runtime_error("no filter could be installed");
  }
  seccomp_release(filter);
}

std::string ErrorOfEntering() {
  return MessageOf<HostError>([] { EnterGate(); });
}

TEST_F(GateProcessTest, WithoutFiltersItCannotBeEntered) {
  InChild([] {
    AnswerInstead(SCMP_SYS(seccomp), ENOSYS);
    EXPECT_EQ(ErrorOfEntering(),
              "the gate to the kernel cannot be entered: seccomp: Function not implemented");
  });
}

TEST_F(GateProcessTest, WithoutAHandlerItCannotBeEntered) {
  InChild([] {
    AnswerInstead(SCMP_SYS(rt_sigaction), EINVAL);
    EXPECT_EQ(ErrorOfEntering(),
              "the gate to the kernel cannot be entered: sigaction: Invalid argument");
  });
}

TEST_F(GateProcessTest, EmulatorThatOnlyPretendsToFilterIsFoundOut) {
  InChild([] {
    AnswerInstead(SCMP_SYS(seccomp), 0);
    EXPECT_EQ(ErrorOfEntering(),
              "the gate to the kernel does not work here: system calls are not trapped, as under "
              "an emulator that answers unknown ones itself (valgrind does)");
  });
}

}  // namespace
}  // namespace StandIn
