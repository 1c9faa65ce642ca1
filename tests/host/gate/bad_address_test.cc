// Private calls with addresses that cannot be used.
#include <unistd.h>

#include <vector>

#include "tests/host/gate/gate_fixture.h"

namespace StandIn {
namespace {

using SecPolicy::ZekAccess_FileRule;
using SecPolicyTest::Outcome;
using testing::IsEmpty;

constexpr unsigned int kDomain = 1;

// What is good of a call's arguments.
struct Good {
  std::uint32_t cell = 0;
  ZekAccess_FileRule record{"/new", 0x1};
};

// A call with one address that is the test's.
struct BadAddress {
  const char* name;
  std::string (*ask)(void* address, Good& good);
};

const std::vector<BadAddress> kCallsThatRead = {
    {"create-domain name",
     [](void* p, Good& good) { return Ask(PrivateCall::kCreateDomain, p, 0, &good.cell); }},
    {"update-rule path",
     [](void* p, Good&) { return Ask(PrivateCall::kUpdateRule, kDomain, p, 1); }},
    {"remove-rule path",
     [](void* p, Good&) { return Ask(PrivateCall::kRemoveRule, 0, kDomain, p); }},
    {"add-rules records",
     [](void* p, Good& good) { return Ask(PrivateCall::kAddRules, 0, kDomain, p, 1, &good.cell); }},
    {"replace-path old", [](void* p, Good&) { return Ask(PrivateCall::kReplacePath, p, "/new"); }},
    {"replace-path new", [](void* p, Good&) { return Ask(PrivateCall::kReplacePath, "/held", p); }},
};

const std::vector<BadAddress> kCallsThatWrite = {
    {"create-domain id",
     [](void* p, Good&) { return Ask(PrivateCall::kCreateDomain, "newDom", 0, p); }},
    {"read-rules records",
     [](void* p, Good&) { return Ask(PrivateCall::kReadRules, kDomain, p, 9); }},
    {"count-rules count", [](void* p, Good&) { return Ask(PrivateCall::kCountRules, kDomain, p); }},
    {"add-rules result",
     [](void* p, Good& good) {
       return Ask(PrivateCall::kAddRules, 0, kDomain, &good.record, 1, p);
     }},
    {"leaked-domains count",
     [](void* p, Good&) { return Ask(PrivateCall::kLeakedDomains, p, p, 0UL); }},
    {"leaked-domains ids",
     [](void* p, Good& good) { return Ask(PrivateCall::kLeakedDomains, &good.cell, p, 9UL); }},
    {"world-domain id", [](void* p, Good&) { return Ask(PrivateCall::kWorldDomain, getpid(), p); }},
    {"domain-name buffer",
     [](void* p, Good&) { return Ask(PrivateCall::kDomainName, kDomain, p, 128UL); }},
};

// The rows that do not answer that the address is bad, and what they answer.
std::string NotRefused(const std::vector<BadAddress>& rows, const std::vector<void*>& addresses) {
  std::string wrong;
  Good good;
  for (const BadAddress& row : rows) {
    for (void* address : addresses) {
      const std::string answer = row.ask(address, good);
      if (answer != "0xbad000e EFAULT") {
        wrong += row.name + (" at " + std::to_string(reinterpret_cast<std::uint64_t>(address))) +
                 ": " + answer + "\n";
      }
    }
  }
  return wrong;
}

std::vector<void*> UnmappedAddresses(const LastPage& page) {
  return {nullptr,       Address(1),        page.End(),         Address(0x7fff'ffff'fff0),
          Address(~0UL), Address(~0UL - 2), Address(1UL << 63), Address(0xffff'8000'0000'0000)};
}

class BadAddressTest : public GateTest {
 protected:
  // A domain that is leaked and has a file rule.
  void SetUp() override {
    InHost([] {
      std::uint32_t cell = 0;
      ZekAccess_FileRule rule{"/held", 0x1};
      ASSERT_EQ(Ask(PrivateCall::kCreateDomain, "heldDom", 1, &cell), "done");
      ASSERT_EQ(Ask(PrivateCall::kAddRules, 0, kDomain, &rule, 1, &cell), "done");
    });
  }

  // The operations of `outcome` that would change what the kernel holds.
  static std::vector<std::string> Changes(const Outcome& outcome) {
    return outcome.Operations({"create-domain", "destroy-domain", "update-file-rule",
                               "remove-file-rule", "add-file-rules", "replace-path"});
  }
};

TEST_F(BadAddressTest, UnmappedMemoryToReadIsRefusedAndNothingDone) {
  const Outcome outcome = Run([] {
    const LastPage page;
    return NotRefused(kCallsThatRead, UnmappedAddresses(page));
  });
  EXPECT_EQ(outcome.value, "");
  EXPECT_EQ(outcome.signal, 0);
  EXPECT_THAT(outcome.Operations(), IsEmpty());
}

TEST_F(BadAddressTest, UnmappedMemoryToWriteIsRefusedAndNothingChanged) {
  const Outcome outcome = Run([] {
    const LastPage page;
    return NotRefused(kCallsThatWrite, UnmappedAddresses(page));
  });
  EXPECT_EQ(outcome.value, "");
  EXPECT_EQ(outcome.signal, 0);
  EXPECT_THAT(Changes(outcome), IsEmpty());
}

TEST_F(BadAddressTest, ReadOnlyMemoryToWriteIsRefusedAndNothingChanged) {
  const Outcome outcome = Run([] {
    LastPage page;
    page.MakeReadOnly();
    return NotRefused(kCallsThatWrite, {page.Begin(), page.End() - 4});
  });
  EXPECT_EQ(outcome.value, "");
  EXPECT_EQ(outcome.signal, 0);
  EXPECT_THAT(Changes(outcome), IsEmpty());
}

TEST_F(BadAddressTest, CellThatLiesHalfInUnmappedMemoryIsRefused) {
  const Outcome outcome = Run([] {
    const LastPage page;
    return NotRefused(kCallsThatWrite, {page.End() - 2});
  });
  EXPECT_EQ(outcome.value, "");
  EXPECT_THAT(Changes(outcome), IsEmpty());
}

TEST_F(BadAddressTest, WithoutACellForTheirCountNoDomainsAreFilledIn) {
  const Outcome outcome = Run([] {
    std::uint32_t id = 99;
    return InTurn({Ask(PrivateCall::kLeakedDomains, nullptr, &id, 1UL), std::to_string(id)});
  });
  EXPECT_EQ(outcome.value, "0xbad000e EFAULT, 99");
  EXPECT_THAT(outcome.Operations(), IsEmpty());
}

TEST_F(BadAddressTest, CellNeedNotBeAligned) {
  InHost([] {
    char bytes[8] = {};
    EXPECT_EQ(Ask(PrivateCall::kCreateDomain, "newDom", 0, bytes + 1), "done");
    EXPECT_EQ(std::string(bytes, 6), std::string({0, 2, 0, 0, 0, 0}));
  });
}

TEST_F(BadAddressTest, TextMayEndWhereMemoryEnds) {
  InHost([] {
    std::uint32_t cell = 0;
    LastPage page;
    LastPage other;
    EXPECT_EQ(Ask(PrivateCall::kCreateDomain, page.PutAtEnd({"n\0", 2}), 0, &cell), "done");
    EXPECT_EQ(Ask(PrivateCall::kReplacePath, page.PutAtEnd({"/held\0", 6}),
                  other.PutAtEnd({"/other\0", 7})),
              "done");
    EXPECT_EQ(Ask(PrivateCall::kUpdateRule, kDomain, page.PutAtEnd({"/other\0", 7}), 0x3), "done");
    EXPECT_EQ(Ask(PrivateCall::kRemoveRule, 0, kDomain, page.PutAtEnd({"/other\0", 7})), "done");
  });
}

TEST_F(BadAddressTest, TextThatRunsIntoUnmappedMemoryIsRefused) {
  const Outcome outcome = Run([] {
    LastPage page;
    return NotRefused(kCallsThatRead, {page.PutAtEnd("/text"), page.PutAtEnd("/")});
  });
  EXPECT_EQ(outcome.value, "");
  EXPECT_THAT(outcome.Operations(), IsEmpty());
}

TEST_F(BadAddressTest, RecordMayEndWhereMemoryEnds) {
  InHost([] {
    LastPage page;
    std::uint32_t cell = 0;
    const ZekAccess_FileRule record{"/new", 0x1};
    const char* bytes = reinterpret_cast<const char*>(&record);
    const char* last = page.PutAtEnd({bytes, sizeof record});
    EXPECT_EQ(Ask(PrivateCall::kAddRules, 0, kDomain, last, 1, &cell), "done");
    EXPECT_EQ(cell, 1u);
    EXPECT_EQ(Ask(PrivateCall::kReadRules, kDomain, page.End() - 2 * sizeof record, 2), "done");
    EXPECT_STREQ(page.End() - 2 * sizeof record, "/held");
    EXPECT_STREQ(page.End() - sizeof record, "/new");
  });
}

TEST_F(BadAddressTest, RecordWhosePermissionCannotBeReadIsNotTaken) {
  const Outcome outcome = Run([] {
    LastPage page;
    std::uint32_t cell = 0;
    const ZekAccess_FileRule record{"/new", 0x1};
    const char* bytes = reinterpret_cast<const char*>(&record);
    const char* cut = page.PutAtEnd({bytes, sizeof record - 1});
    return InTurn({Ask(PrivateCall::kAddRules, 0, kDomain, cut, 1, &cell), std::to_string(cell)});
  });
  EXPECT_EQ(outcome.value, "0xbad000e EFAULT, 0");
  EXPECT_THAT(outcome.Operations(), IsEmpty());
}

}  // namespace
}  // namespace StandIn
