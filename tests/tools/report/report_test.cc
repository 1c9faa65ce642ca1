// secpolicy report.
#include <nlohmann/json.hpp>

#include "tests/tools/command_fixture.h"
#include "tests/tools/schema.h"
#include "tests/tools/stand_in_dot.h"

namespace SecPolicyTool {
namespace {

using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

class ReportTest : public CommandTest {
 protected:
  ReportTest() {
    Policy("objects/base", "conf\n");
    Policy("domains/appDom", "-a conf read grant\n");
  }
  void SetUp() override { MakeHost(); }

  [[nodiscard]] std::string Page() const { return Path("page.html"); }
  [[nodiscard]] Arguments Verb(const std::string& source, const Arguments& more = {}) const {
    Arguments arguments{"report", "--host", Host(), source, "-o", Page()};
    arguments.insert(arguments.end(), more.begin(), more.end());
    return arguments;
  }
};

TEST_F(ReportTest, WritesAPage) {
  const Result result = Done(Verb(PolicyDir()));
  EXPECT_EQ(result.out + result.err, "");
  const std::string page = StandIn::ReadBytes(Page());
  EXPECT_THAT(page, StartsWith("<!DOCTYPE html>\n<html lang=\"en\">"));
  EXPECT_THAT(page, HasSubstr("<h3>appDom</h3>"));
  EXPECT_THAT(page, HasSubstr("<small>line 1</small>"));
  EXPECT_THAT(page, HasSubstr("<h2 id=\"findings-title\">Findings</h2>"));
}

TEST_F(ReportTest, SamePolicyGivesTheSameBytes) {
  Done(Verb(PolicyDir()));
  const std::string page = StandIn::ReadBytes(Page());
  StandIn::WriteBytes(Page(), "old");
  Done(Verb(PolicyDir()));
  EXPECT_EQ(StandIn::ReadBytes(Page()), page);
}

TEST_F(ReportTest, KernelHasNoFindings) {
  ASSERT_EQ(Load().status, 0);
  Done(Verb("kernel"));
  const std::string page = StandIn::ReadBytes(Page());
  EXPECT_THAT(page, HasSubstr("<h3>appDom</h3>"));
  EXPECT_THAT(page, Not(HasSubstr("Findings")));
}

TEST_F(ReportTest, DirectoryWithErrorsIsShownWithThem) {
  Policy("domains/appDom", "-s read grant\n-x\n");
  const Result result = Done(Verb(PolicyDir()));
  EXPECT_THAT(result.err, StartsWith("Warning: a load of "));
  const std::string page = StandIn::ReadBytes(Page());
  EXPECT_THAT(page, HasSubstr("<b class=\"error\">error</b>"));
  EXPECT_THAT(page, HasSubstr("<code>-s read grant</code>"));
}

TEST_F(ReportTest, FailureOfGraphvizIsAWarning) {
  const StandInDot failing("echo broken >&2; exit 1\n");
  EXPECT_EQ(Done(Verb(PolicyDir())).err,
            "Warning: Graphviz failed: broken; the transitions are drawn without it\n");
  EXPECT_THAT(StandIn::ReadBytes(Page()), HasSubstr("class=\"node\""));
}

TEST_F(ReportTest, JsonIsAsDescribed) {
  Policy("domains/appDom", "-s read grant\n-x\n");
  const auto json = nlohmann::json::parse(Done(Verb(PolicyDir(), {"--json"})).out);
  EXPECT_EQ(JsonProblem(json.dump(), "report"), "");
  EXPECT_EQ(json["source"], PolicyDir());
  EXPECT_EQ(json["file"], Page());
  EXPECT_GT(json["findings"], 0);
  EXPECT_THAT(StandIn::ReadBytes(Page()),
              HasSubstr("<b>" + json["findings"].dump() + "</b><span>findings</span>"));
}

TEST_F(ReportTest, JsonOfAKernelHasNoFindings) {
  const std::string text = Done(Verb("kernel", {"--json"})).out;
  EXPECT_EQ(JsonProblem(text, "report"), "");
  const auto json = nlohmann::json::parse(text);
  EXPECT_EQ(json["findings"], nullptr);
  EXPECT_EQ(json["sha256"].get<std::string>() + "\n",
            Done({"digest", "--host", Host(), "kernel"}).out);
}

TEST_F(ReportTest, PageThatCannotBeWritten) {
  const Result result =
      Command({"report", "--host", Host(), PolicyDir(), "-o", Path("nowhere/page.html")});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.err, "Error: " + Path("nowhere/page.html") +
                            ": cannot be written: No such file or directory\n");
}

TEST_F(ReportTest, WrongUse) {
  EXPECT_EQ(Command({"report", "--host", Host(), PolicyDir()}).status, 2);
  EXPECT_EQ(Command({"report", "--host", Host(), "-o", Page()}).status, 2);
}

}  // namespace
}  // namespace SecPolicyTool
