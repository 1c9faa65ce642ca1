// load --trace and load --fail.
#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

using testing::AllOf;
using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

class TraceOptionTest : public CommandTest {
 protected:
  TraceOptionTest() { Policy("domains/appDom", "-s open grant\n-s read grant\n"); }

  void SetUp() override { MakeHost(); }
};

TEST_F(TraceOptionTest, OperationsStandBetweenTheProgressThatTheyMake) {
  const Result result = Load({"--trace"});
  EXPECT_EQ(result.status, 0);
  const std::vector<std::string> lines = result.Errors();
  ASSERT_GE(lines.size(), 20u);
  EXPECT_THAT(std::vector<std::string>(lines.begin(), lines.begin() + 4),
              ElementsAre("kernel: open-interface", "Using policy dir " + PolicyDir(),
                          "Parsed all objects", "kernel: words object"));
  EXPECT_THAT(lines, AllOf(Contains("kernel: set-rule appDom -s open grant # line 1"),
                           Contains("kernel: set-rule appDom -s read grant # line 2"),
                           Contains("kernel: set-global-vm-domain globalVMDom")));
  EXPECT_EQ(lines.back(), "kernel: close-interface");
}

TEST_F(TraceOptionTest, WithoutItNoOperationIsShown) {
  EXPECT_THAT(Load().err, Not(HasSubstr("kernel: ")));
}

TEST_F(TraceOptionTest, FailRefusesTheNthCall) {
  const Result result = Load({"--trace", "--fail", "set-rule:2"});
  EXPECT_EQ(result.status, 1);
  EXPECT_THAT(
      result.Errors(),
      AllOf(Contains("kernel: set-rule appDom -s open grant # line 1"),
            Contains("kernel: set-rule appDom -s read grant # line 2 ! refused on request: "
                     "set-rule, call 2"),
            Contains("Error: Error in setting policy for domain: appDom: 2 : refused on request: "
                     "set-rule, call 2")));
  EXPECT_THAT(Shown(), AllOf(HasSubstr("-s open grant"), Not(HasSubstr("-s read grant"))));
}

TEST_F(TraceOptionTest, FailWithoutANumberRefusesTheFirstCall) {
  const Result result = Load({"--fail", "create-domain"});
  EXPECT_EQ(result.status, 3);
  EXPECT_THAT(result.Errors(), Contains("Error: Failed to create domain: appDom"));
  EXPECT_THAT(Shown(), Not(HasSubstr("appDom")));
}

TEST_F(TraceOptionTest, FailMayBeGivenSeveralTimes) {
  const Result result = Load({"--fail", "set-rule:1", "--fail", "add-labels:1"});
  EXPECT_EQ(result.status, 1);
  EXPECT_THAT(result.Errors(), Contains(HasSubstr("refused on request: set-rule, call 1")));
  EXPECT_THAT(result.Errors(), Contains("Error: Error in defining some objects"));
}

TEST_F(TraceOptionTest, FailureOfACallThatIsNotMadeChangesNothing) {
  EXPECT_EQ(Load({"--fail", "set-rule:99"}).status, 0);
}

TEST_F(TraceOptionTest, RefusedRoleEndsTheLoadAtOnce) {
  const Result result = Load({"--fail", "set-global-vm-domain"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.Errors().back(), "Error: refused on request: set-global-vm-domain, call 1");
  EXPECT_THAT(result.Errors(), Not(Contains(StartsWith("Parsed all file label"))));
}

}  // namespace
}  // namespace SecPolicyTool
