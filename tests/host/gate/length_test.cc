// Private calls with names, paths and counts at their limits and beyond.
#include <array>
#include <limits>
#include <vector>

#include "tests/host/gate/gate_fixture.h"

namespace StandIn {
namespace {

using SecPolicy::ZekAccess_FileRule;
using SecPolicyTest::Outcome;
using testing::IsEmpty;

constexpr unsigned int kMost = std::numeric_limits<unsigned int>::max();

// An absolute path of so many bytes.
std::string PathOf(std::size_t bytes) { return "/" + std::string(bytes - 1, 'p'); }

std::vector<ZekAccess_FileRule> Records(unsigned int count) {
  std::vector<ZekAccess_FileRule> records(count);
  for (unsigned int i = 0; i < count; ++i) {
    ("/" + std::to_string(i)).copy(records[i].path, sizeof records[i].path);
    records[i].permission = 0x1;
  }
  return records;
}

using LengthTest = GateTest;

TEST_F(LengthTest, NameOf127BytesIsTheLongest) {
  InHost([] {
    std::uint32_t id = 0;
    const std::string longest(127, 'n');
    EXPECT_EQ(Ask(PrivateCall::kCreateDomain, longest.c_str(), 0, &id), "done");
    EXPECT_EQ(Ask(PrivateCall::kCreateDomain, (longest + "n").c_str(), 0, &id),
              "0xbad0024 ENAMETOOLONG");
    std::array<char, 128> name{};
    EXPECT_EQ(Ask(PrivateCall::kDomainName, id, name.data(), name.size()), "done");
    EXPECT_EQ(name.data(), longest);
  });
}

TEST_F(LengthTest, NameWithoutAnEndIsRefused) {
  const Outcome outcome = Run([] {
    LastPage page;
    std::uint32_t id = 0;
    const char* name = page.PutAtEnd(std::string(128, 'n'));
    return Ask(PrivateCall::kCreateDomain, name, 0, &id);
  });
  EXPECT_EQ(outcome.value, "0xbad0024 ENAMETOOLONG");
  EXPECT_THAT(outcome.Operations(), IsEmpty());
}

TEST_F(LengthTest, EmptyNameIsRefusedByTheModule) {
  InHost([] {
    std::uint32_t id = 0;
    EXPECT_EQ(Ask(PrivateCall::kCreateDomain, "", 0, &id), "0xbad0016 EINVAL");
  });
}

TEST_F(LengthTest, NamesBufferNeedsRoomForTheEnd) {
  InHost([] {
    std::array<char, 8> name;
    name.fill('x');
    EXPECT_EQ(Ask(PrivateCall::kDomainName, 0, name.data(), 0UL), "0xbad0022 ERANGE");
    EXPECT_EQ(Ask(PrivateCall::kDomainName, 0, name.data(), 7UL), "0xbad0022 ERANGE");
    EXPECT_EQ(name[0], 'x');
    EXPECT_EQ(Ask(PrivateCall::kDomainName, 0, name.data(), 8UL), "done");
    EXPECT_STREQ(name.data(), "rootDom");
    EXPECT_EQ(Ask(PrivateCall::kDomainName, 0, name.data(), ~0UL), "done");
  });
}

TEST_F(LengthTest, PathOf1983BytesIsTheLongest) {
  InHost([] {
    std::uint32_t taken = 0;
    ZekAccess_FileRule rule{"/a", 0x1};
    ASSERT_EQ(Ask(PrivateCall::kAddRules, 0, 0, &rule, 1, &taken), "done");
    EXPECT_EQ(Ask(PrivateCall::kReplacePath, "/a", PathOf(1984).c_str()), "0xbad0024 ENAMETOOLONG");
    EXPECT_EQ(Ask(PrivateCall::kReplacePath, "/a", PathOf(1983).c_str()), "done");
    EXPECT_EQ(Ask(PrivateCall::kUpdateRule, 0, PathOf(1983).c_str(), 0x2), "done");
    ASSERT_EQ(Ask(PrivateCall::kReadRules, 0, &rule, 1), "done");
    EXPECT_EQ(std::string(rule.path), PathOf(1983));
    EXPECT_EQ(Ask(PrivateCall::kRemoveRule, 0, 0, PathOf(1983).c_str()), "done");
  });
}

TEST_F(LengthTest, PathWithoutAnEndIsRefused) {
  const Outcome outcome = Run([] {
    LastPage page;
    const char* path = page.PutAtEnd(PathOf(1984));
    return InTurn(
        {Ask(PrivateCall::kUpdateRule, 0, path, 1), Ask(PrivateCall::kRemoveRule, 0, 0, path),
         Ask(PrivateCall::kReplacePath, path, "/a"), Ask(PrivateCall::kReplacePath, "/a", path)});
  });
  EXPECT_EQ(outcome.value,
            "0xbad0024 ENAMETOOLONG, 0xbad0024 ENAMETOOLONG, 0xbad0024 ENAMETOOLONG, "
            "0xbad0024 ENAMETOOLONG");
  EXPECT_THAT(outcome.Operations(), IsEmpty());
}

TEST_F(LengthTest, RecordWhosePathFillsItsFieldIsRefused) {
  const Outcome outcome = Run([] {
    std::uint32_t taken = 99;
    ZekAccess_FileRule rule{};
    std::memset(rule.path, '/', sizeof rule.path);
    rule.permission = 0x1;
    return InTurn({Ask(PrivateCall::kAddRules, 0, 0, &rule, 1, &taken), std::to_string(taken)});
  });
  EXPECT_EQ(outcome.value, "0xbad0024 ENAMETOOLONG, 0");
  EXPECT_THAT(outcome.Operations(), IsEmpty());
}

TEST_F(LengthTest, NoRecordsAreJudgedByTheirDomainAlone) {
  const Outcome outcome = Run([] {
    std::uint32_t taken = 99;
    return InTurn({Ask(PrivateCall::kAddRules, 0, 0, nullptr, 0, &taken), std::to_string(taken),
                   Ask(PrivateCall::kAddRules, 0, 77, nullptr, 0, &taken)});
  });
  EXPECT_EQ(outcome.value, "done, 0, 0xbad0002 ENOENT");
}

TEST_F(LengthTest, ManyRecordsAreAllTaken) {
  InHost([] {
    for (const unsigned int count : {255u, 256u, 257u, 513u}) {
      std::uint32_t taken = 0;
      std::uint32_t held = 0;
      const auto records = Records(count);
      EXPECT_EQ(Ask(PrivateCall::kAddRules, 0, 0, records.data(), count, &taken), "done");
      EXPECT_EQ(taken, count);
      EXPECT_EQ(Ask(PrivateCall::kCountRules, 0, &held), "done");
      EXPECT_EQ(held, count);
    }
  });
}

TEST_F(LengthTest, RefusalHalfWayCountsWhatWasTaken) {
  InHost([] {
    auto records = Records(300);
    records[280].path[0] = 'x';
    std::uint32_t taken = 0;
    std::uint32_t held = 0;
    EXPECT_EQ(Ask(PrivateCall::kAddRules, 0, 0, records.data(), 300, &taken), "0xbad0016 EINVAL");
    EXPECT_EQ(taken, 280u);
    EXPECT_EQ(Ask(PrivateCall::kCountRules, 0, &held), "done");
    EXPECT_EQ(held, 280u);
  });
}

TEST_F(LengthTest, CountBeyondTheMemoryIsRefusedAndCountsWhatWasTaken) {
  InHost([] {
    LastPage page;
    const auto records = Records(8);
    const auto* bytes = reinterpret_cast<const char*>(records.data());
    const char* all = page.PutAtEnd({bytes, 8 * sizeof records[0]});
    for (const unsigned int count : {9u, kMost}) {
      std::uint32_t taken = 99;
      std::uint32_t held = 99;
      EXPECT_EQ(Ask(PrivateCall::kAddRules, 0, 0, all, count, &taken), "0xbad000e EFAULT");
      EXPECT_EQ(Ask(PrivateCall::kCountRules, 0, &held), "done");
      EXPECT_EQ(taken, held) << count;
    }
  });
}

TEST_F(LengthTest, RoomThatNobodyHasIsNotTouched) {
  InHost([] {
    std::uint32_t cell = 0;
    auto records = Records(1);
    ASSERT_EQ(Ask(PrivateCall::kAddRules, 0, 0, records.data(), 1, &cell), "done");
    EXPECT_EQ(Ask(PrivateCall::kReadRules, 0, records.data(), kMost), "done");
    EXPECT_EQ(Ask(PrivateCall::kLeakedDomains, &cell, nullptr, ~0UL), "done");
    EXPECT_EQ(cell, 0u);
  });
}

TEST_F(LengthTest, LastRecordMayBeTheLastMemory) {
  InHost([] {
    std::uint32_t taken = 0;
    const auto records = Records(2);
    ASSERT_EQ(Ask(PrivateCall::kAddRules, 0, 0, records.data(), 2, &taken), "done");
    LastPage page;
    EXPECT_EQ(Ask(PrivateCall::kReadRules, 0, page.End() - sizeof records[0], 2),
              "0xbad000e EFAULT");
  });
}

}  // namespace
}  // namespace StandIn
