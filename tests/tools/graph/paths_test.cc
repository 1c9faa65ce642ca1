// secpolicy paths.
#include <nlohmann/json.hpp>

#include "tests/tools/command_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

class PathsTest : public CommandTest {
 protected:
  PathsTest() {
    Policy("objects/base", "shell\nguest\n");
    Policy("domains/rootDom", "-d shell shellDom exec grant\n-d guest guestDom exec grant\n");
    Policy("domains/shellDom", "-d guest guestDom exec grant\n-d shell guestDom fork grant\n");
    Policy("domains/guestDom", "-d shell rootDom exec revoke\n");
  }
  void SetUp() override { MakeHost(); }

  [[nodiscard]] Result Paths(const Arguments& more) const {
    Arguments arguments{"paths", "--host", Host(), "--policy", PolicyDir()};
    arguments.insert(arguments.end(), more.begin(), more.end());
    return Command(arguments);
  }
  [[nodiscard]] std::string File(const std::string& domain) const {
    return PolicyDir() + "/domains/" + domain;
  }
};

TEST_F(PathsTest, ShortestFirstEachStepWithItsRules) {
  const Result result = Paths({"rootDom", "guestDom"});
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.out,
            "1. rootDom -> guestDom (1 step)\n"
            "   rootDom -> guestDom\n"
            "     -d guest guestDom exec grant  " +
                File("rootDom") +
                ":2:1\n"
                "2. rootDom -> shellDom -> guestDom (2 steps)\n"
                "   rootDom -> shellDom\n"
                "     -d shell shellDom exec grant  " +
                File("rootDom") +
                ":1:1\n"
                "   shellDom -> guestDom\n"
                "     -d guest guestDom exec grant  " +
                File("shellDom") +
                ":1:1\n"
                "     -d shell guestDom fork grant  " +
                File("shellDom") + ":2:1\n");
  EXPECT_EQ(result.err, "");
}

TEST_F(PathsTest, NotReachedIsNo) {
  const Result result = Paths({"guestDom", "rootDom"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.out, "rootDom is not reached from guestDom\n");
  EXPECT_EQ(result.err, "");
}

TEST_F(PathsTest, OneEventAlone) {
  const Result none = Paths({"--event", "fork", "rootDom", "guestDom"});
  EXPECT_EQ(none.status, 1);
  EXPECT_EQ(none.out, "guestDom is not reached from rootDom by fork\n");
  const Result one = Paths({"--event", "fork", "shellDom", "guestDom"});
  EXPECT_EQ(one.status, 0);
  EXPECT_THAT(one.out, Not(HasSubstr("exec")));
}

TEST_F(PathsTest, DomainIsWhereItStarts) {
  const Result result = Paths({"guestDom", "guestDom"});
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.out, "1. guestDom (0 steps)\n");
}

TEST_F(PathsTest, MoreThanAskedForIsSaid) {
  const Result result = Paths({"--max", "1", "rootDom", "guestDom"});
  EXPECT_THAT(result.out, StartsWith("1. rootDom -> guestDom (1 step)\n"));
  EXPECT_THAT(result.out, Not(HasSubstr("2. ")));
  EXPECT_THAT(result.out, HasSubstr("\nThere are more paths, which are not shorter.\n"));
  EXPECT_THAT(Paths({"--all", "rootDom", "guestDom"}).out, HasSubstr("2. "));
}

TEST_F(PathsTest, TheKernelIsAskedWithoutAPolicy) {
  const Arguments arguments{"paths", "--host", Host(), "rootDom", "appDom"};
  EXPECT_THAT(Command(arguments).err, HasSubstr("unknown domain \"appDom\"\n"));
  ASSERT_EQ(Load().status, 0);
  EXPECT_EQ(Done(arguments).out,
            "1. rootDom -> appDom (1 step)\n   rootDom -> appDom\n"
            "     -d tardisk appDom exec grant  -\n");
}

TEST_F(PathsTest, WrongNames) {
  struct Case {
    Arguments arguments;
    const char* error;
  };
  for (const Case& row : {
           Case{{"rootDom", "guesDom"}, "unknown domain \"guesDom\" (nearest: guestDom)"},
           Case{{"nothingLikeIt", "guestDom"}, "unknown domain \"nothingLikeIt\""},
           Case{{"a\x1b", "guestDom"}, "unknown domain \"a\\x1b\""},
           Case{{"--event", "sleep", "rootDom", "guestDom"}, "unknown transition event \"sleep\""},
       }) {
    SCOPED_TRACE(row.error);
    const Result result = Paths(row.arguments);
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.err, std::string("Error: ") + row.error + "\n");
  }
}

TEST_F(PathsTest, WrongUse) {
  for (const Arguments& arguments :
       std::vector<Arguments>{{"rootDom"},
                              {"--max", "0", "rootDom", "guestDom"},
                              {"--max", "1001", "rootDom", "guestDom"},
                              {"--max", "2", "--all", "rootDom", "guestDom"}}) {
    EXPECT_EQ(Paths(arguments).status, 2) << arguments.front();
  }
}

TEST_F(PathsTest, JsonIsAsDescribed) {
  const std::string text = Paths({"--json", "--max", "1", "rootDom", "guestDom"}).out;
  EXPECT_EQ(JsonProblem(text, "paths"), "");
  const auto json = nlohmann::json::parse(text);
  EXPECT_EQ(json["from"], "rootDom");
  EXPECT_EQ(json["to"], "guestDom");
  EXPECT_EQ(json["more"], true);
  EXPECT_EQ(json["paths"].dump(),
            R"([[{"from":"rootDom","rules":[{"event":"exec","label":"guest","place":)"
            R"({"column":1,"file":")" +
                File("rootDom") + R"(","line":2}}],"to":"guestDom"}]])");
  const Result none = Paths({"--json", "guestDom", "rootDom"});
  EXPECT_EQ(none.status, 1);
  EXPECT_EQ(JsonProblem(none.out, "paths"), "");
}

}  // namespace
}  // namespace SecPolicyTool
