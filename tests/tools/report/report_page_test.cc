// The page of a report.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

#include "tests/tools/some_policy.h"
#include "tools/query/digest.h"
#include "tools/report/report.h"

namespace SecPolicyTool {
namespace {

using testing::HasSubstr;
using testing::Not;

Report SomeReport() {
  Report report;
  report.source = "policy";
  Policy& policy = report.policy;
  policy.domains["aDom"].place = Place{"policy/domains/aDom", 0, 0};
  policy.domains["aDom"].rules = {SomeRule(RuleType::kObjectAccess, {"conf", "read"}),
                                  SomeRule(RuleType::kSyscall, {"ptrace"}, false), Goes("bDom")};
  policy.domains["aDom"].rules[0].place = Place{"policy/domains/aDom", 7, 3};
  policy.domains["bDom"];
  policy.objects["conf"].place = Place{"policy/objects/base", 1, 1};
  policy.objects["default"].isPredefined = true;
  policy.files["/etc/hosts"] = {"conf", Place{"policy/fileLabels/base", 2, 1}};
  policy.files["/lost"] = {"", std::nullopt};
  policy.tardisks["base.tar"] = {"conf", std::nullopt};
  report.drawing = DrawCircle(TransitionGraph(policy));
  return report;
}

std::size_t CountOf(const std::string& text, const std::string& part) {
  std::size_t count = 0;
  for (std::size_t at = 0; (at = text.find(part, at)) != std::string::npos; ++at) ++count;
  return count;
}

TEST(ReportPageTest, HeadHasTheCountsAndTheDigest) {
  const Report report = SomeReport();
  const std::string page = ReportPage(report);
  EXPECT_THAT(page, HasSubstr("<title>Security policy: policy</title>"));
  EXPECT_THAT(page, HasSubstr("<code>" + Digest(report.policy) + "</code>"));
  for (const char* figure :
       {"<b>2</b><span>domains</span>", "<b>3</b><span>rules</span>",
        "<b>1</b><span>transitions</span>", "<b>3</b><span>labels</span>",
        "<b>2</b><span>labelled files</span>", "<b>1</b><span>labelled tardisks</span>"}) {
    EXPECT_THAT(page, HasSubstr(figure));
  }
}

TEST(ReportPageTest, DomainHasItsRulesWithLinksAndPlaces) {
  const std::string page = ReportPage(SomeReport());
  EXPECT_THAT(page, HasSubstr("<details class=\"entry\" id=\"domain-0\"><summary><h3>aDom</h3>"));
  EXPECT_THAT(page, HasSubstr("<span title=\"1 object access rule\"><small>-a</small> 1</span>"));
  EXPECT_THAT(page, HasSubstr("<li><code>-a <a href=\"#label-0\">conf</a> read grant</code> "
                              "<small>line 7</small></li>"));
  EXPECT_THAT(page, HasSubstr("<li class=\"no\"><code>-s ptrace revoke</code> </li>"));
  EXPECT_THAT(page, HasSubstr("<li><code>-d <a href=\"#label-2\">tobDom</a> "
                              "<a href=\"#domain-1\">bDom</a> exec grant</code> </li>"));
  EXPECT_THAT(page, HasSubstr("<b>Reached from</b><ul class=\"names\">"
                              "<li><a href=\"#domain-0\">aDom</a></li></ul>"));
  EXPECT_THAT(page, HasSubstr("<p>No rules.</p>"));
}

TEST(ReportPageTest, PathRulesShowTheirPermissionAndWorld) {
  Report report = SomeReport();
  PolicyRule rule = SomeRule(RuleType::kPath, {"/etc/hosts"});
  rule.permission = 4;
  rule.key.world = 17;
  PolicyRule none = SomeRule(RuleType::kPath, {"/etc/shadow"});
  report.policy.domains["bDom"].rules = {rule, none};
  const std::string page = ReportPage(report);
  EXPECT_THAT(page, HasSubstr("<code>" + LineOf(rule) + "</code>"));
  EXPECT_THAT(page, HasSubstr("<li class=\"no\"><code>-r /etc/shadow</code>"));
}

TEST(ReportPageTest, LabelHasItsUses) {
  const std::string page = ReportPage(SomeReport());
  EXPECT_THAT(page, HasSubstr("<h3>conf</h3> <span class=\"count\">1 rule, 1 file, 1 tardisk</span>"
                              "</summary><small>policy/objects/base:1:1</small>"
                              "<p><a href=\"#files-0\">Carried by 1 file</a></p>"
                              "<p>Carried by the tardisk <code>base.tar</code></p>"));
  EXPECT_THAT(page, HasSubstr("<li><a href=\"#domain-0\">aDom</a> "
                              "<code>-a conf read grant</code></li>"));
  EXPECT_THAT(page, HasSubstr("<h3>default</h3> <span class=\"count\">not used</span></summary>"
                              "<p>Predefined by the kernel.</p>"));
  EXPECT_THAT(page, HasSubstr("<h3>tobDom</h3> <span class=\"count\">1 rule</span></summary>"
                              "<p>No object has this name.</p>"));
}

TEST(ReportPageTest, RuleThatNamesALabelTwiceIsOneUse) {
  Report report = SomeReport();
  report.policy.domains["bDom"].rules = {
      SomeRule(RuleType::kFileCreation, {"conf", "conf", "file"})};
  EXPECT_THAT(ReportPage(report),
              HasSubstr("<h3>conf</h3> <span class=\"count\">2 rules, 1 file, 1 tardisk</span>"));
}

TEST(ReportPageTest, FilesAndTardisksHaveTheirLabels) {
  const std::string page = ReportPage(SomeReport());
  EXPECT_THAT(page, HasSubstr("id=\"files-0\"><summary><h3>conf</h3>"));
  EXPECT_THAT(page, HasSubstr("<li><code>/etc/hosts</code> "
                              "<small>policy/fileLabels/base:2:1</small></li>"));
  EXPECT_THAT(page, HasSubstr("<h3>a label that has no name any more</h3>"));
  EXPECT_THAT(page, HasSubstr("<code>base.tar</code> carries <a href=\"#label-0\">conf</a>"));
}

TEST(ReportPageTest, FindingsAreShownWithTheirLines) {
  Report report = SomeReport();
  EXPECT_THAT(ReportPage(report), Not(HasSubstr("id=\"findings\"")));
  report.findings.emplace();
  EXPECT_THAT(ReportPage(report), HasSubstr("A check of its files finds nothing."));
  Finding finding;
  finding.severity = Severity::kWarning;
  finding.place = {"policy/domains/aDom", 3, 4};
  finding.length = 4;
  finding.message = "what is wrong";
  finding.help = "what would be right";
  finding.source = "-s opan grant";
  report.findings->push_back(finding);
  finding.severity = Severity::kError;
  finding.place.column = 99;
  report.findings->push_back(finding);
  const std::string page = ReportPage(report);
  EXPECT_THAT(page, HasSubstr("<b>2</b><span>findings</span>"));
  EXPECT_THAT(page, HasSubstr("<li class=\"entry\"><b class=\"warning\">warning</b> "
                              "<span>what is wrong</span> <small>policy/domains/aDom:3:4</small>"
                              "<code class=\"line\">-s <mark>opan</mark> grant</code>"
                              "<p>what would be right</p></li>"));
  EXPECT_THAT(page, HasSubstr("<b class=\"error\">error</b>"));
}

TEST(ReportPageTest, EmptyPolicyIsAPageToo) {
  Report report;
  report.source = "kernel";
  const std::string page = ReportPage(report);
  EXPECT_THAT(page, HasSubstr("<p>No domain goes to another.</p>"));
  EXPECT_THAT(page, HasSubstr("No file carries another label than default."));
  EXPECT_THAT(page, HasSubstr("No tardisk carries another label than default."));
}

TEST(ReportPageTest, GraphIsDrawnWithLinksToTheDomains) {
  const std::string page = ReportPage(SomeReport());
  EXPECT_EQ(CountOf(page, "class=\"node\""), 2U);
  EXPECT_EQ(CountOf(page, "class=\"link\""), 1U);
  EXPECT_THAT(page, HasSubstr("<title>aDom to bDom: tobDom, exec</title>"));
  EXPECT_THAT(page, HasSubstr("<a class=\"node\" href=\"#domain-1\""));
}

TEST(ReportPageTest, TooManyLinksAreDrawnAsOne) {
  Report report;
  for (int i = 0; i < 61; ++i) {
    for (int j = 0; j < 50; ++j) {
      report.policy.domains[std::to_string(i)].rules.push_back(Goes(std::to_string(j)));
    }
  }
  report.drawing = DrawCircle(TransitionGraph(report.policy));
  const std::string page = ReportPage(report);
  EXPECT_EQ(CountOf(page, "class=\"link\""), 0U);
  EXPECT_EQ(CountOf(page, "class=\"texture\""), 1U);
  EXPECT_EQ(CountOf(page, "class=\"node\""), 61U);
  EXPECT_THAT(page, Not(HasSubstr("Full size")));
  report.drawing.width = 2000;
  EXPECT_THAT(ReportPage(report), HasSubstr("<input type=\"checkbox\"> Full size</label>"));
}

TEST(ReportPageTest, SameReportGivesTheSameBytes) {
  EXPECT_EQ(ReportPage(SomeReport()), ReportPage(SomeReport()));
}

TEST(ReportPageTest, NeedsNothingFromOutside) {
  const std::string page = ReportPage(SomeReport());
  for (const char* part : {"http:", "https:", "//www", "@import", "src=", "url(\"h"}) {
    EXPECT_THAT(page, Not(HasSubstr(part)));
  }
  EXPECT_THAT(page, HasSubstr("content=\"default-src &#39;none&#39;; style-src "));
  EXPECT_THAT(page, Not(HasSubstr("unsafe")));
}

// Wherever a policy's words stand, they are words.
TEST(ReportPageTest, WordsOfThePolicyAreInert) {
  const std::string evil = "<script>\"'&</script>\x01\xff";
  Report report = SomeReport();
  report.source = evil;
  const Place place{evil, 1, 1};
  DomainContent& domain = report.policy.domains[evil];
  domain.place = place;
  for (std::size_t i = 0; i < kRuleTypes.size(); ++i) {
    const auto type = static_cast<RuleType>(i);
    domain.rules.push_back(SomeRule(type, std::vector<std::string>(InfoOf(type).wordCount, evil)));
    domain.rules.back().place = place;
  }
  report.policy.objects[evil] = {false, place};
  report.policy.files[evil] = {evil, place};
  report.policy.tardisks[evil] = {evil, place};
  Finding finding;
  finding.id = finding.message = finding.help = finding.source = finding.loadMessage = evil;
  finding.place = place;
  report.findings = {finding};
  report.drawing = DrawCircle(TransitionGraph(report.policy));

  const std::string page = ReportPage(report);
  EXPECT_EQ(CountOf(page, "<script"), 1U);
  EXPECT_EQ(CountOf(page, "</script"), 1U);
  EXPECT_GT(CountOf(page, "&lt;script&gt;&quot;&#39;&amp;&lt;/script&gt;\\x01\\xff"), 20U);
  EXPECT_EQ(std::count_if(page.begin(), page.end(),
                          [](char c) { return static_cast<unsigned char>(c) < 0x20 && c != '\n'; }),
            0);
}

}  // namespace
}  // namespace SecPolicyTool
