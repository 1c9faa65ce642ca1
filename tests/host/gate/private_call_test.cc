// The private system calls, from the instruction to the module and back.
#include <sys/syscall.h>
#include <unistd.h>

#include <vector>

#include "host/attached_host.h"
#include "tests/host/gate/gate_fixture.h"

namespace StandIn {
namespace {

using SecPolicy::ZekAccess_FileRule;
using SecPolicyTest::Operation;
using SecPolicyTest::Outcome;
using testing::ElementsAre;
using testing::IsEmpty;

using PrivateCallTest = GateTest;

TEST_F(PrivateCallTest, LibraryReachesTheModule) {
  const Outcome outcome = Run([] { return SecPolicy::GetDomainNameForID(0); });
  EXPECT_EQ(outcome.value, "rootDom");
  EXPECT_THAT(outcome.Operations(), ElementsAre("domain-name 0"));
}

TEST_F(PrivateCallTest, CLibrarysSyscallReachesTheModule) {
  InHost([] {
    unsigned int id = 0;
    EXPECT_EQ(syscall(16474, "netDom", 0UL, &id), 0);
    EXPECT_EQ(id, 1u);
    EXPECT_EQ(syscall(16474, "netDom", 0UL, &id), 0x0bad0000 + EEXIST);
    EXPECT_EQ(syscall(16475, 1UL), 0);
    EXPECT_EQ(syscall(16475, 1UL), 0x0bad0000 + ENOENT);
  });
}

TEST_F(PrivateCallTest, RefusalHasAStatusAndAnErrorValue) {
  InHost([] {
    std::uint32_t id = 0;
    ASSERT_EQ(Ask(PrivateCall::kCreateDomain, "netDom", 0, &id), "done");
    EXPECT_EQ(Ask(PrivateCall::kCreateDomain, "netDom", 0, &id), "0xbad0011 EEXIST");
    EXPECT_EQ(Ask(PrivateCall::kDestroyDomain, 0), "0xbad0010 EBUSY");
    EXPECT_EQ(Ask(PrivateCall::kDestroyDomain, 99), "0xbad0002 ENOENT");
    EXPECT_EQ(Ask(PrivateCall::kWorldDomain, -1, &id), "0xbad0003 ESRCH");
  });
}

TEST_F(PrivateCallTest, EveryCallOfOneDomainsLife) {
  InHost([] {
    std::uint32_t id = 0;
    std::uint32_t count = 0;
    char name[128] = {};
    ZekAccess_FileRule rules[2] = {{"/etc/a", 0x1}, {"/etc/b", 0x10}};
    EXPECT_EQ(Ask(PrivateCall::kCreateDomain, "netDom", 1, &id), "done");
    EXPECT_EQ(Ask(PrivateCall::kDomainName, id, name, sizeof name), "done");
    EXPECT_STREQ(name, "netDom");
    EXPECT_EQ(Ask(PrivateCall::kAddRules, 0, id, rules, 2, &count), "done");
    EXPECT_EQ(count, 2u);
    EXPECT_EQ(Ask(PrivateCall::kUpdateRule, id, "/etc/a", 0x3), "done");
    EXPECT_EQ(Ask(PrivateCall::kReplacePath, "/etc/a", "/etc/c"), "done");
    EXPECT_EQ(Ask(PrivateCall::kRemoveRule, 0, id, "/etc/b"), "done");
    EXPECT_EQ(Ask(PrivateCall::kCountRules, id, &count), "done");
    EXPECT_EQ(count, 1u);
    EXPECT_EQ(Ask(PrivateCall::kReadRules, id, rules, 2), "done");
    EXPECT_STREQ(rules[0].path, "/etc/c");
    EXPECT_EQ(rules[0].permission, 0x3u);
    EXPECT_STREQ(rules[1].path, "/etc/b");  // as the caller left it
    EXPECT_EQ(Ask(PrivateCall::kDestroyDomain, id), "done");
  });
}

TEST_F(PrivateCallTest, ReadRecordsAreFilledToTheirEnd) {
  InHost([] {
    std::uint32_t taken = 0;
    ZekAccess_FileRule rule{"/a", 0x1};
    ASSERT_EQ(Ask(PrivateCall::kAddRules, 0, 0, &rule, 1, &taken), "done");
    std::memset(&rule, 'x', sizeof rule);
    ASSERT_EQ(Ask(PrivateCall::kReadRules, 0, &rule, 1), "done");
    EXPECT_EQ(std::string(rule.path, sizeof rule.path), std::string("/a").append(1982, '\0'));
  });
}

TEST_F(PrivateCallTest, TooSmallATableHasAStatusOfItsOwn) {
  InHost([] {
    std::uint32_t taken = 0;
    ZekAccess_FileRule rules[2] = {{"/a", 0x1}, {"/b", 0x1}};
    ASSERT_EQ(Ask(PrivateCall::kAddRules, 0, 0, rules, 2, &taken), "done");
    rules[0].path[1] = 'x';
    EXPECT_EQ(Ask(PrivateCall::kReadRules, 0, rules, 1), "0xbad011f ENOSPC");
    EXPECT_EQ(Ask(PrivateCall::kReadRules, 0, nullptr, 0), "0xbad011f ENOSPC");
    EXPECT_STREQ(rules[0].path, "/x");
  });
}

TEST_F(PrivateCallTest, RunningWorldIsItsProcess) {
  InHost([] {
    std::uint32_t id = 99;
    EXPECT_EQ(Ask(PrivateCall::kWorldDomain, getpid(), &id), "done");
    EXPECT_EQ(id, 0u);
  });
}

TEST_F(PrivateCallTest, OriginHasTwoValues) {
  const Outcome outcome = Run([] {
    std::uint32_t id = 0;
    return InTurn({Ask(PrivateCall::kCreateDomain, "one", 1, &id),
                   Ask(PrivateCall::kCreateDomain, "two", 2, &id),
                   Ask(PrivateCall::kCreateDomain, "all", ~0UL, &id)});
  });
  EXPECT_EQ(outcome.value, "done, 0xbad0016 EINVAL, 0xbad0016 EINVAL");
  EXPECT_THAT(outcome.Operations(), ElementsAre("create-domain one run-time"));
}

TEST_F(PrivateCallTest, LeakedDomainsAreThoseOfEndedProcesses) {
  const auto leaked = [] {
    std::uint32_t count = 99;
    std::uint32_t ids[4] = {99, 99, 99, 99};
    EXPECT_EQ(Ask(PrivateCall::kLeakedDomains, &count, ids, 4UL), "done");
    return std::vector<std::uint32_t>(ids, ids + std::min(count, 4u));
  };
  InHost([&] {
    std::uint32_t id = 0;
    ASSERT_EQ(Ask(PrivateCall::kCreateDomain, "policyDom", 0, &id), "done");
    ASSERT_EQ(Ask(PrivateCall::kCreateDomain, "leakedDom", 1, &id), "done");
    EXPECT_THAT(leaked(), IsEmpty());  // its maker runs
  });
  InHost([&] { EXPECT_THAT(leaked(), ElementsAre(2u)); });
}

TEST_F(PrivateCallTest, MoreLeakedDomainsThanRoomFillTheRoom) {
  InHost([] {
    std::uint32_t id = 0;
    for (const char* name : {"a", "b", "c"}) Ask(PrivateCall::kCreateDomain, name, 1, &id);
  });
  InHost([] {
    std::uint32_t count = 0;
    std::uint32_t ids[3] = {99, 99, 99};
    EXPECT_EQ(Ask(PrivateCall::kLeakedDomains, &count, ids, 2UL), "done");
    EXPECT_EQ(count, 3u);
    EXPECT_THAT(ids, ElementsAre(1u, 2u, 99u));
    EXPECT_EQ(Ask(PrivateCall::kLeakedDomains, &count, nullptr, 0UL), "done");
    EXPECT_EQ(count, 3u);
  });
}

TEST_F(PrivateCallTest, NumbersWithoutANameAreUnknown) {
  const Outcome outcome = Run([] {
    std::string wrong;
    for (long number = 16481; number <= 16484; ++number) {
      const std::string answer = Ask(static_cast<PrivateCall>(number), 1, "name", 2);
      if (answer != "0xbad0026 ENOSYS") wrong += std::to_string(number) + ": " + answer + "\n";
    }
    return wrong;
  });
  EXPECT_EQ(outcome.value, "");
  EXPECT_THAT(outcome.Operations(), IsEmpty());
}

TEST_F(PrivateCallTest, NumbersBesideTheModulesAreTheKernels) {
  InHost([] {
    EXPECT_EQ(Ask(static_cast<PrivateCall>(16473)), "kernel: ENOSYS");
    EXPECT_EQ(Ask(static_cast<PrivateCall>(16489)), "kernel: ENOSYS");
  });
}

TEST_F(PrivateCallTest, InjectedStatusAndErrorAreTheCalls) {
  SecPolicyTest::Fault silent{.operation = Operation::kCountFileRules, .status = 0x0bad0777};
  Fail(silent);
  Fail(Operation::kDestroyDomain, 1, EPERM);
  const Outcome outcome = Run([] {
    std::uint32_t count = 0;
    errno = E2BIG;
    const long status = SecPolicy::IssuePrivateCall(PrivateCall::kCountRules, 0, &count);
    return InTurn({AnswerText(status, errno), Ask(PrivateCall::kDestroyDomain, 1)});
  });
  EXPECT_EQ(outcome.value, "0xbad0777 E2BIG, 0xbad0001 EPERM");
}

TEST_F(PrivateCallTest, MemoryThatRunsOutInTheKernelIsARefusal) {
  Fail({.operation = Operation::kCountFileRules, .kind = SecPolicyTest::Fault::Kind::kOutOfMemory});
  const Outcome outcome = Run([] {
    std::uint32_t count = 0;
    return Ask(PrivateCall::kCountRules, 0, &count);
  });
  EXPECT_EQ(outcome.value, "0xbad000c ENOMEM");
}

TEST_F(PrivateCallTest, SuccessLeavesErrnoAsItWas) {
  InHost([] {
    std::uint32_t count = 0;
    errno = E2BIG;
    EXPECT_EQ(syscall(16479, 0UL, &count), 0);
    EXPECT_EQ(errno, E2BIG);
  });
}

TEST_F(PrivateCallTest, WithoutAHostTheCallsDoNotExist) {
  BehindTheGate([] {
    std::uint32_t count = 0;
    for (long number = 16474; number <= 16488; ++number) {
      EXPECT_EQ(Ask(static_cast<PrivateCall>(number), 0, &count, 0), "kernel: ENOSYS") << number;
    }
  });
}

TEST_F(PrivateCallTest, AfterTheHostIsLeftTheCallsDoNotExist) {
  InHost([] {
    std::uint32_t count = 0;
    EXPECT_EQ(Ask(PrivateCall::kCountRules, 0, &count), "done");
    Attach(nullptr);
    EXPECT_EQ(Ask(PrivateCall::kCountRules, 0, &count), "kernel: ENOSYS");
  });
}

}  // namespace
}  // namespace StandIn
