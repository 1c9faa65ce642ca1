// The state of the module across operations and processes.
#include "host/state/state_keeper.h"

#include <gmock/gmock.h>
#include <unistd.h>

#include <cerrno>
#include <set>

#include "host/kernel/proc_processes.h"
#include "host/module/module_error.h"
#include "host/trace/observed_module.h"
#include "tests/host/module/module_fixture.h"
#include "tests/host/state/kept_module.h"
#include "tests/support/child_process.h"

namespace StandIn {
namespace {

class StateKeeperTest : public HostFixture {
 protected:
  [[nodiscard]] std::string Kept() const { return ReadBytes(Path("kernel.json")); }
};

TEST_F(StateKeeperTest, ChangeIsKeptBeforeItReportsSuccess) {
  KeptModule kernel(Host());
  EXPECT_FALSE(Exists("kernel.json"));
  kernel.Create("netDom");
  EXPECT_THAT(Kept(), testing::HasSubstr("netDom"));
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom netDom");
}

TEST_F(StateKeeperTest, QuestionsWriteNothing) {
  KeptModule kernel(Host());
  kernel.Module().FindDomain("netDom");
  kernel.Module().MaxDomains();
  kernel.Module().Words(WordList::kObjects);
  EXPECT_FALSE(Exists("kernel.json"));
}

TEST_F(StateKeeperTest, OthersChangesAreSeen) {
  KeptModule kernel(Host());
  kernel.Create("oneDom");
  ASSERT_TRUE(ChildPassed(StartChild([&] { KeptModule(Host()).Create("twoDom"); })));
  EXPECT_EQ(kernel.Domains(), "rootDom oneDom twoDom");
  kernel.Create("threeDom");
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oneDom twoDom threeDom");
}

TEST_F(StateKeeperTest, ForkedChildGoesOnWithWhatTheParentHas) {
  KeptModule kernel(Host());
  kernel.Create("oneDom");
  ASSERT_TRUE(ChildPassed(StartChild([&] { kernel.Create("twoDom"); })));
  kernel.Create("threeDom");
  EXPECT_EQ(kernel.Domains(), "rootDom oneDom twoDom threeDom");
}

TEST_F(StateKeeperTest, NewStartOfTheMachineIsSeen) {
  KeptModule kernel(Host());
  kernel.Create("netDom");
  StateFile(Host()).Remove();
  EXPECT_EQ(kernel.Domains(), "rootDom");
}

// Twenty processes, each of which makes domains of its own.
constexpr int kProcesses = 20;
constexpr int kDomainsEach = 4;

void CreateSome(KeptModule& kernel, int process) {
  for (int i = 0; i < kDomainsEach; ++i) {
    kernel.Create("dom" + std::to_string(process) + "-" + std::to_string(i));
  }
}

void ExpectAllDomains(KeptModule& kernel) {
  std::set<DomainId> ids;
  for (int process = 0; process < kProcesses; ++process) {
    for (int i = 0; i < kDomainsEach; ++i) {
      const std::string name = "dom" + std::to_string(process) + "-" + std::to_string(i);
      const auto id = kernel.Module().FindDomain(name);
      ASSERT_TRUE(id.has_value()) << name;
      EXPECT_TRUE(ids.insert(*id).second) << name << " shares the id " << *id;
    }
  }
  EXPECT_EQ(*ids.rbegin(), static_cast<DomainId>(kProcesses * kDomainsEach));
}

TEST_F(StateKeeperTest, OfTwentyProcessesAtOnceNoOperationIsLostOrDoubled) {
  std::vector<pid_t> children;
  for (int process = 0; process < kProcesses; ++process) {
    children.push_back(StartChild([&] {
      KeptModule kernel(Host());
      CreateSome(kernel, process);
    }));
  }
  for (const pid_t child : children) EXPECT_TRUE(ChildPassed(child));
  KeptModule kernel(Host());
  ExpectAllDomains(kernel);
}

TEST_F(StateKeeperTest, OfTwentyForkedCopiesNoOperationIsLostOrDoubled) {
  KeptModule kernel(Host());
  std::vector<pid_t> children;
  for (int process = 0; process < kProcesses; ++process) {
    children.push_back(StartChild([&] { CreateSome(kernel, process); }));
  }
  for (const pid_t child : children) EXPECT_TRUE(ChildPassed(child));
  ExpectAllDomains(kernel);
}

TEST_F(StateKeeperTest, OfTwentyProcessesOneOnlyMakesADomain) {
  std::vector<pid_t> children;
  for (int process = 0; process < kProcesses; ++process) {
    children.push_back(StartChild([&] {
      if (RefusalOf([&] { KeptModule(Host()).Create("oneDom"); }) != "(done)") _exit(1);
    }));
  }
  int made = 0;
  for (const pid_t child : children) made += ChildPassed(child) ? 1 : 0;
  EXPECT_EQ(made, 1);
}

TEST_F(StateKeeperTest, WhatARefusedOperationDidIsKept) {
  KeptModule kernel(Host());
  std::uint32_t taken = 0;
  EXPECT_EQ(RefusalOf([&] {
              kernel.Module().AddFileRules(0, {{0, "/a", 0x1}, {0, "b", 0x1}}, taken);
            }),
            "EINVAL: the path \"b\" is not absolute");
  EXPECT_EQ(KeptModule(Host()).Module().CountFileRules(0), 1u);
}

TEST_F(StateKeeperTest, OperationsOutsideTheStateNeedNoLock) {
  KeptModule kernel(Host());
  StateFile other(Host());
  const StateFile::Lock lock(other);
  EXPECT_EQ(kernel.Module().MaxDomains(), 1024u);  // would wait for ever
}

}  // namespace
}  // namespace StandIn
