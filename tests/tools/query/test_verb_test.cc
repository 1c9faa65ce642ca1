// Unit tests of policies, run by the command.
#include <nlohmann/json.hpp>

#include "tests/tools/query/query_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

class TestVerbTest : public QueryTest {
 protected:
  [[nodiscard]] std::string File() const { return Path("checks"); }

  Result RunFile(const std::string& text, Arguments more = {}) const {
    StandIn::WriteBytes(File(), text);
    more.insert(more.end(), {"--policy", PolicyDir(), File()});
    return Verb("test", more);
  }
};

constexpr char kHolds[] =
    "may netDom exec /bin/ls\nnever netDom syscall ptrace\nreaches rootDom netDom exec\n"
    "unreachable netDom rootDom\n";
constexpr char kFails[] = "never netDom syscall open  # no\nreaches netDom rootDom\n";

TEST_F(TestVerbTest, FileThatHoldsPasses) {
  const Result result = RunFile(kHolds);
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.out, "4 statements, 0 failed\n");
  EXPECT_EQ(result.err, "");
}

TEST_F(TestVerbTest, WhatFailsIsPrinted) {
  const Result result = RunFile(std::string(kHolds) + kFails);
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(Short(result.out),
            File() +
                ":5: expected \"never netDom syscall open\", but yes: -s open grant "
                "(policy/domains/netDom:2:1)\n" +
                File() + ":6: expected \"reaches netDom rootDom\", but no way\n" +
                "6 statements, 2 failed\n");
}

TEST_F(TestVerbTest, KernelIsTestedUnlessAPolicyIsNamed) {
  ASSERT_EQ(Load().status, 0);
  StandIn::WriteBytes(File(), kHolds);
  const Result result = Verb("test", {File()});
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.out, "4 statements, 0 failed\n");
}

TEST_F(TestVerbTest, MistakesAreAllNamedAndNothingPasses) {
  const Result result =
      RunFile(std::string(kHolds) + "may netDom syscall opn\n  must netDom syscall open\n");
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.out, "");
  EXPECT_EQ(result.err, "Error: " + File() +
                            ":5:20: unknown system call \"opn\" (nearest: open)\n" +
                            "Error: " + File() + ":6:3: unknown statement \"must\"\n" +
                            "Error: " + File() + " has mistakes; nothing was tested\n");
}

TEST_F(TestVerbTest, FileWithoutStatementsIsAnError) {
  const Result result = RunFile("# may netDom syscall open\n\n");
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.out, "");
  EXPECT_EQ(result.err, "Error: " + File() + " has no statements\n");
}

TEST_F(TestVerbTest, FileThatCannotBeReadIsAnError) {
  EXPECT_EQ(Verb("test", {Path("none")}).err,
            "Error: " + Path("none") + ": cannot be opened: No such file or directory\n");
  const Result directory = Verb("test", {PolicyDir()});
  EXPECT_EQ(directory.status, 1);
  EXPECT_EQ(directory.err, "Error: " + PolicyDir() + ": cannot be read: Is a directory\n");
}

TEST_F(TestVerbTest, PolicyWithErrorsIsNotTested) {
  Policy("domains/netDom", "-s opn grant\n");
  const Result result = RunFile(kFails);
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.out, "");
  EXPECT_EQ(result.Errors().back(), "Error: " + PolicyDir() + " cannot be loaded without errors");
}

TEST_F(TestVerbTest, TapIsPrintedOnDemand) {
  const Result result =
      RunFile("may netDom syscall open\nmay netDom syscall close\n", {"--format", "tap"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.out,
            "TAP version 13\n1..2\nok 1 - may netDom syscall open\n"
            "not ok 2 - may netDom syscall close\n# " +
                File() + ":2: no: no rule\n");
}

TEST_F(TestVerbTest, JsonIsAsDescribed) {
  const std::string text = std::string(kHolds) + kFails + "reaches netDom netDom\n";
  const Result result = RunFile(text, {"--json"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(JsonProblem(result.out, "test"), "");
  EXPECT_EQ(RunFile(text, {"--format", "json"}).out, result.out);
  const auto json = nlohmann::json::parse(result.out);
  EXPECT_EQ(json["statements"], 7);
  EXPECT_EQ(json["failed"], 2);
  EXPECT_EQ(json["results"][4]["rule"]["line"], "-s open grant");
  EXPECT_EQ(json["results"][2]["way"][0]["from"], "rootDom");
}

TEST_F(TestVerbTest, WrongUsageIsRefused) {
  EXPECT_EQ(Verb("test", {}).status, 2);
  EXPECT_EQ(Verb("test", {File(), "--format", "xml"}).status, 2);
  EXPECT_EQ(Verb("test", {File(), "--format", "tap", "--json"}).status, 2);
}

}  // namespace
}  // namespace SecPolicyTool
