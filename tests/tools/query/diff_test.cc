// The difference of two policies, as the command tells it.
#include <filesystem>
#include <nlohmann/json.hpp>

#include "tests/tools/query/query_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

using testing::HasSubstr;
using testing::StartsWith;

class DiffTest : public QueryTest {
 protected:
  // A copy of the policy as it is now, under another name.
  std::string Copy() const {
    std::filesystem::copy(PolicyDir(), Path("before"), std::filesystem::copy_options::recursive);
    return Path("before");
  }
};

TEST_F(DiffTest, EqualPoliciesPrintNothing) {
  const std::string before = Copy();
  Policy("domains/appDom", "# other order\n-r /usr/ xr # same\n-s open revoke\n-s open grant\n");
  const Result result = Verb("diff", {before, PolicyDir()});
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.out, "");
  EXPECT_EQ(result.err, "");
}

TEST_F(DiffTest, DifferencesAreGroupedByDomain) {
  const std::string before = Copy();
  Policy("domains/appDom", "-s open revoke\n-s read grant\n-r /usr r\n");
  Policy("domains/newDom", "-s open grant\n");
  Policy("domains/rootDom", "-d program newDom exec grant\n");
  Policy("objects/more", "more\n");
  const Result result = Verb("diff", {before, PolicyDir()});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.err, "");
  EXPECT_EQ(Short(result.out),
            "domain appDom\n"
            "~ -r /usr rx -> r  (policy/domains/appDom:3:1)\n"
            "~ -s open grant -> revoke  (policy/domains/appDom:1:1)\n"
            "+ -s read grant  (policy/domains/appDom:2:1)\n"
            "\n"
            "+ domain newDom  (policy/domains/newDom)\n"
            "+ -s open grant  (policy/domains/newDom:1:1)\n"
            "\n"
            "domain rootDom\n"
            "~ -d program netDom -> newDom exec grant  (policy/domains/rootDom:1:1)\n"
            "\n"
            "objects\n"
            "+ more  (policy/objects/more:1:1)\n");
}

TEST_F(DiffTest, FileLabelsOfATreeAreSaidOnce) {
  const std::string before = Copy();
  // The walk passes the link over, so the link does not keep the rest apart.
  Policy("fileLabels/base", "/etc/net/* conf\n/etc/hosts program\n");
  EXPECT_EQ(Printed("diff", {before, PolicyDir()}),
            "file labels\n"
            "+ /etc/hosts program  (policy/fileLabels/base:2:1)\n"
            "+ /etc/net/* (3 files) conf  (policy/fileLabels/base:1:1)\n");
}

TEST_F(DiffTest, DriftOfTheKernelIsShown) {
  ASSERT_EQ(Load().status, 0);
  EXPECT_EQ(Verb("diff", {PolicyDir(), "kernel"}).status, 0);
  // A load does not take the rule back whose line has gone.
  Policy("domains/appDom", "-r /usr rx\n");
  ASSERT_EQ(Load().status, 0);
  const Result result = Verb("diff", {PolicyDir(), "kernel"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.out, "domain appDom\n+ -s open grant  (line 1)\n");
}

TEST_F(DiffTest, DirectoryWithErrorsIsComparedAsItWouldBeLoaded) {
  const std::string before = Copy();
  Policy("domains/appDom", "-s open grant\n-x\n-r /usr rx\n");
  const Result result = Verb("diff", {before, PolicyDir()});
  EXPECT_EQ(result.status, 1);
  EXPECT_THAT(result.err, StartsWith("Warning: a load of " + PolicyDir() + " reports errors"));
  EXPECT_THAT(result.out, StartsWith("domain appDom\n- -r /usr rx  ("));
}

TEST_F(DiffTest, MissingDirectoryIsAnError) {
  const Result result = Verb("diff", {PolicyDir(), Path("none")});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.err, "Error: there is no policy directory " + Path("none") + "\n");
}

TEST_F(DiffTest, UsageNeedsTwoSources) {
  EXPECT_EQ(Verb("diff", {PolicyDir()}).status, 2);
  EXPECT_EQ(Verb("diff", {PolicyDir(), "kernel", "kernel"}).status, 2);
}

TEST_F(DiffTest, JsonIsAsDescribed) {
  const std::string before = Copy();
  Policy("domains/appDom", "-s open revoke\n-s read grant\n-r /usr\n");
  Policy("domains/newDom", "-s open grant\n");
  std::filesystem::remove(PolicyDir() + "/domains/netDom");
  Policy("domains/rootDom", "");
  Policy("objects/more", "more\n");
  Policy("fileLabels/base", "/etc/net/* conf\n");
  const Result result = Verb("diff", {"--json", before, PolicyDir()});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(JsonProblem(result.out, "diff"), "");
  const auto json = nlohmann::json::parse(result.out);
  EXPECT_EQ(json["equal"], false);
  EXPECT_EQ(json["files"].size(), 3U);
  EXPECT_EQ(json["files"][0]["path"], "/etc/net");
  EXPECT_EQ(json["files"][0]["after"]["label"], "conf");
  EXPECT_EQ(json["domains"][0]["rules"][1]["before"]["line"], "-s open grant");
  EXPECT_EQ(json["domains"][0]["rules"][1]["after"]["line"], "-s open revoke");
}

TEST_F(DiffTest, JsonOfEqualPoliciesSaysSo) {
  const Result result = Verb("diff", {"--json", PolicyDir(), PolicyDir()});
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(JsonProblem(result.out, "diff"), "");
  EXPECT_THAT(result.out, HasSubstr("\"equal\": true"));
}

TEST_F(DiffTest, SchemaRefusesAChangeWithoutItsSides) {
  const auto text = [](const char* entry) {
    return std::string(R"({"a": "x", "b": "y", "equal": false, "domains": [], "objects": [)") +
           entry + R"(], "tardisks": [], "files": []})";
  };
  EXPECT_EQ(JsonProblem(text(R"({"change": "added", "name": "n", "after": {}})"), "diff"), "");
  EXPECT_THAT(JsonProblem(text(R"({"change": "added", "name": "n", "before": {}})"), "diff"),
              HasSubstr("errors"));
  EXPECT_THAT(JsonProblem(text(R"({"change": "changed", "name": "n", "after": {}})"), "diff"),
              HasSubstr("errors"));
}

}  // namespace
}  // namespace SecPolicyTool
