// Tables that change while they are read.
#include "tools/kernel/tables.h"

#include <cstring>

#include "platform/private_calls.h"
#include "tests/support/host_test.h"
#include "tests/support/scripted_kernel.h"

namespace SecPolicyTool {
namespace {

using SecPolicyTest::KernelAnswer;
using SecPolicyTest::Outcome;
using SecPolicyTest::ScriptedKernel;
using SecPolicyTest::SeenCall;
using ZekCtl::Kernel::PrivateCall;

class TablesTest : public SecPolicyTest::HostTest {
 protected:
  // Reads the table from a kernel that says it has each of `counts` rules in turn, and holds the
  // last number of them.
  Outcome ReadFrom(std::vector<std::uint32_t> counts, std::uint32_t held) {
    return Run([&]() -> std::string {
      std::size_t asked = 0;
      const ScriptedKernel kernel([&](const SeenCall& call) -> KernelAnswer {
        if (call.number == static_cast<long>(PrivateCall::kCountRules)) {
          *call.At<std::uint32_t>(1) = counts.at(asked++);
          return {};
        }
        if (call.arguments[2] < held) return {ZekCtl::Kernel::kStatusTableTooSmall, 0};
        auto* rules = call.At<SecPolicy::ZekAccess_FileRule>(1);
        for (std::uint32_t i = 0; i < held; ++i) std::strcpy(rules[i].path, "/a");
        return {};
      });
      const std::size_t size = ReadFileRules(3).size();
      return std::to_string(size) + " rules after " + std::to_string(kernel.Calls().size()) +
             " calls";
    });
  }
};

TEST_F(TablesTest, IsReadAtOnceWhenNothingChanges) {
  EXPECT_EQ(ReadFrom({2}, 2).value, "2 rules after 2 calls");
  EXPECT_EQ(ReadFrom({0}, 0).value, "0 rules after 2 calls");
}

TEST_F(TablesTest, IsReadAgainWhileRulesAreAdded) {
  EXPECT_EQ(ReadFrom({1, 2, 3}, 3).value, "3 rules after 6 calls");
}

TEST_F(TablesTest, RulesThatWereRemovedMeanwhileAreNotShown) {
  EXPECT_EQ(ReadFrom({5}, 2).value, "2 rules after 2 calls");
}

TEST_F(TablesTest, OtherFailuresPass) {
  const Outcome outcome = Run([] {
    const ScriptedKernel kernel(KernelAnswer{1, -EIO});
    ReadFileRules(3);
  });
  EXPECT_EQ(outcome.error,
            "Failed to get number of file policies for domain :: 3:Input/output error");
}

}  // namespace
}  // namespace SecPolicyTool
