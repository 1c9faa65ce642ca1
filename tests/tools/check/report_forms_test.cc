// The forms in which findings are handed over.
#include "tools/check/report_forms.h"

#include <nlohmann/json.hpp>

#include "tests/tools/check/check_fixture.h"
#include "tests/tools/schema.h"
#include "tools/check/line_excerpt.h"

namespace SecPolicyTool {

namespace {

using nlohmann::json;
using testing::HasSubstr;

struct ExcerptCase {
  std::string line;
  unsigned int column;
  unsigned int length;
  std::string text;
  std::string mark;
};

TEST(LineExcerpt, MarkStandsBelowWhatIsMeant) {
  const std::string tilde(119, '~');
  const ExcerptCase kCases[] = {
      {"-s opne grant", 4, 4, "-s opne grant", "   ^~~~"},
      {"x", 1, 1, "x", "^"},
      {"", 1, 0, "", "^"},
      {"ab", 9, 4, "ab", "  ^"},
      {"ab", 0, 2, "ab", "^~"},
      {"a\tb c", 5, 1, "a\\x09b c", "       ^"},
      {"\x1b[31m x", 7, 1, "\\x1b[31m x", "         ^"},
      {"c\rd", 2, 1, "c\\x0dd", " ^~~~"},
      {"\xC3\xA4 b", 4, 1, "\xC3\xA4 b", "  ^"},
      {"\xFF\xC3 b", 4, 1, "\\xff\\xc3 b", "         ^"},
      {"\xC2\x85x", 3, 1, "\\xc2\\x85x", "        ^"},
      {std::string("a\0b", 3), 3, 1, "a\\x00b", "     ^"},
      {std::string(200, 'a'), 1, 300, std::string(120, 'a') + "...", "^" + tilde},
      {std::string(100, 'a') + "b" + std::string(99, 'c'), 101, 1,
       "..." + std::string(60, 'a') + "b" + std::string(59, 'c') + "...",
       std::string(63, ' ') + "^"},
      {std::string(150, '\x80'), 1, 1, "", "^~~~"},
  };
  for (const ExcerptCase& one : kCases) {
    const LineExcerpt excerpt = ExcerptOf(one.line, one.column, one.length);
    if (!one.text.empty()) {
      EXPECT_EQ(excerpt.text, one.text);
    }
    EXPECT_EQ(excerpt.mark, one.mark) << one.line;
  }
}

TEST(LineExcerpt, LongLineIsCutBetweenCharacters) {
  std::string line;
  for (int i = 0; i < 200; ++i) line += "\xE2\x82\xAC";
  const LineExcerpt excerpt = ExcerptOf(line, 301, 3);
  EXPECT_THAT(excerpt.text.Text(), testing::Not(HasSubstr("\\x")));
  EXPECT_EQ(excerpt.mark, std::string(23, ' ') + "^");
}

class ReportFormsTest : public CheckTest {
 protected:
  [[nodiscard]] json Json(const Arguments& more = {"--json"}) const {
    return json::parse(Check(more).out);
  }
};

TEST_F(ReportFormsTest, TextHasTheLineAndTheMark) {
  Policy("domains/appDom", "-s  opne\tgrant Grant\n");
  Policy("domains/ioFilterDom", "-s opne grnt\n");
  const Result result = Check();
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(WithoutDir(result.out),
            "domains/appDom:1:5: error: unknown system call \"opne\\x09grant\" [unknown-word]\n"
            "  -s  opne\\x09grant Grant\n"
            "      ^~~~~~~~~~~~~\n"
            "domains/appDom:1:9: warning: a tab separates no words: it is part of the word [tab]\n"
            "  -s  opne\\x09grant Grant\n"
            "          ^~~~\n"
            "help: use spaces\n"
            "domains/appDom:1:16: error: invalid keyword Grant [bad-decision]\n"
            "  -s  opne\\x09grant Grant\n"
            "                    ^~~~~\n"
            "help: did you mean \"grant\"?\n"
            "domains/ioFilterDom:1:4: error: unknown system call \"opne\" (nearest: open) "
            "[unknown-word]\n"
            "  -s opne grnt\n"
            "     ^~~~\n"
            "help: did you mean \"open\"?\n"
            "domains/ioFilterDom:1:9: error: invalid keyword grnt [bad-decision]\n"
            "  -s opne grnt\n"
            "          ^~~~\n"
            "help: did you mean \"grant\"?\n");
  EXPECT_EQ(result.err, "4 errors, 1 warning in 7 files\n");
}

TEST_F(ReportFormsTest, FilesAreNamedAsTheDirectoryWasGiven) {
  Policy("domains/appDom", "-s open Grant\n");
  const auto in = [&](const std::string& dir) {
    return Command({"check", "--host", Host(), dir}, [&] { (void)chdir(Path("").c_str()); }).out;
  };
  EXPECT_THAT(in("policy"), testing::StartsWith("policy/domains/appDom:1:9: error: "));
  EXPECT_THAT(in("./policy//"), testing::StartsWith("./policy/domains/appDom:1:9: error: "));
}

TEST_F(ReportFormsTest, ColourOnlyWhereItIsWanted) {
  Finding finding;
  finding.id = "tab";
  finding.severity = Severity::kWarning;
  finding.place = {"a\x1b", 1, 2};
  finding.message = "bad \x07";
  finding.source = "xy";
  EXPECT_EQ(TextForm(finding, Painter(false)),
            "a\\x1b:1:2: warning: bad \\x07 [tab]\n  xy\n   ^\n");
  EXPECT_EQ(TextForm(finding, Painter(true)),
            "\x1b[1ma\\x1b:1:2: \x1b[0m\x1b[33mwarning:\x1b[0m bad \\x07 [tab]\n"
            "  xy\n   \x1b[33m^\x1b[0m\n");
  finding.place = {};
  finding.severity = Severity::kError;
  EXPECT_EQ(TextForm(finding, Painter(false)), "error: bad \\x07 [tab]\n");
}

TEST_F(ReportFormsTest, JsonIsAsDescribed) {
  Policy("domains/appDom", "-s opne \xFF\n");
  Policy("domains/netDom~", "");
  const Result result = Check({"--json"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.err, "");
  EXPECT_EQ(JsonProblem(result.out, "check"), "");
  EXPECT_EQ(Check({"--format", "json"}).out, result.out);
  const json report = json::parse(result.out);
  EXPECT_EQ(report["source"], PolicyDir());
  EXPECT_EQ(report["files"], 8);
  EXPECT_EQ(report["errors"], 2);
  EXPECT_EQ(report["warnings"], 1);
  const json& first = report["findings"][0];
  EXPECT_EQ(first, json({{"id", "unknown-word"},
                         {"severity", "error"},
                         {"file", PolicyDir() + "/domains/appDom"},
                         {"line", 1},
                         {"column", 4},
                         {"length", 4},
                         {"message", "unknown system call \"opne\" (nearest: open)"},
                         {"loadMessage",
                          "Error in parsing policy for domain: appDom: 1 : unknown system call "
                          "\"opne\" (nearest: open)"},
                         {"help", "did you mean \"open\"?"},
                         {"source", "-s opne \xEF\xBF\xBD"}}));
}

TEST_F(ReportFormsTest, SchemaRefusesWhatItDoesNotDescribe) {
  EXPECT_THAT(JsonProblem(R"({"source": "p", "files": 1, "errors": 1, "warnings": 0, "findings":
      [{"id": "x", "severity": "bad", "message": "", "line": 1}]})",
                          "check"),
              HasSubstr("errors"));
}

TEST_F(ReportFormsTest, SarifIsAsTheStandardHasIt) {
  Policy("domains/appDom", "-s \xC3\xA4\xFFpne grant\n");
  Policy("domains/b d~", "");
  const Result result = Check({"--format", "sarif"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(SchemaProblem(result.out, SECPOLICY_SARIF_SCHEMA), "");
  const json run = json::parse(result.out)["runs"][0];
  EXPECT_EQ(run["tool"]["driver"]["name"], "secpolicy");
  EXPECT_EQ(run["originalUriBaseIds"]["POLICYDIR"]["uri"], "file://" + PolicyDir() + "/");
  const json& results = run["results"];
  ASSERT_EQ(results.size(), 2U);
  const json& rules = run["tool"]["driver"]["rules"];
  for (const json& one : results)
    EXPECT_EQ(rules.at(one["ruleIndex"].get<std::size_t>())["id"], one["ruleId"]);
  const json& word = results[0]["locations"][0]["physicalLocation"];
  EXPECT_EQ(results[0]["level"], "error");
  EXPECT_EQ(word["artifactLocation"],
            json({{"uri", "domains/appDom"}, {"uriBaseId", "POLICYDIR"}}));
  EXPECT_EQ(word["region"], json({{"startLine", 1},
                                  {"startColumn", 4},
                                  {"endColumn", 9},
                                  {"snippet", {{"text", "-s \xC3\xA4\xEF\xBF\xBDpne grant"}}}}));
  EXPECT_EQ(results[1]["level"], "warning");
  EXPECT_EQ(results[1]["locations"][0]["physicalLocation"]["artifactLocation"]["uri"],
            "domains/b%20d~");
}

TEST_F(ReportFormsTest, SarifOfTheWholeDirectoryAndOfTheHost) {
  std::filesystem::remove_all(PolicyDir() + "/domains");
  std::filesystem::create_directories(Host() + "/root/etc/olvane/secpolicy/tardisks");
  StandIn::WriteBytes(Host() + "/root/etc/olvane/secpolicy/tardisks/alien", "");
  const std::string text = Check({"--format", "sarif"}).out;
  EXPECT_EQ(SchemaProblem(text, SECPOLICY_SARIF_SCHEMA), "");
  const json host = json::parse(text)["runs"][0]["results"][0];
  EXPECT_EQ(host["locations"][0]["physicalLocation"]["artifactLocation"],
            json({{"uri", "etc/olvane/secpolicy/tardisks/alien"}, {"uriBaseId", "HOSTROOT"}}));
}

TEST_F(ReportFormsTest, SarifWithoutPlacesAndDirectory) {
  Finding finding;
  finding.id = "load-error";
  finding.message = finding.loadMessage = "something";
  CheckReport report{{finding}, 0};
  finding.place = {"/etc/olvane/secpolicy/domains/appDom", 2, 0};
  finding.source = "abc";
  report.findings.push_back(finding);
  finding.place = {"policy", 0, 0};
  report.findings.push_back(finding);
  const json own = SarifForm(report, "");
  EXPECT_EQ(SchemaProblem(own.dump(), SECPOLICY_SARIF_SCHEMA), "");
  EXPECT_FALSE(own["runs"][0]["results"][0].contains("locations"));
  const json& physical = own["runs"][0]["results"][1]["locations"][0]["physicalLocation"];
  EXPECT_EQ(physical["region"]["endColumn"], 4);
  EXPECT_FALSE(own["runs"][0]["originalUriBaseIds"].contains("POLICYDIR"));
  const json given = SarifForm(report, "policy/");
  EXPECT_EQ(SchemaProblem(given.dump(), SECPOLICY_SARIF_SCHEMA), "");
  EXPECT_EQ(given["runs"][0]["results"][2]["locations"][0]["physicalLocation"]["artifactLocation"],
            json({{"uri", ""}, {"uriBaseId", "POLICYDIR"}}));
}

TEST_F(ReportFormsTest, SarifSchemaRefusesWhatItDoesNotDescribe) {
  EXPECT_NE(SchemaProblem(R"({"version": "2.1.0", "runs": [{}]})", SECPOLICY_SARIF_SCHEMA), "");
}

// ---- The command ----

TEST_F(ReportFormsTest, ExitStatusTellsErrorsFromWarnings) {
  EXPECT_EQ(Check().status, 0);
  EXPECT_EQ(Check().err, "0 errors, 0 warnings in 7 files\n");
  EXPECT_EQ(Check().out, "");
  EXPECT_EQ(Check({"--error-on-warning"}).status, 0);
  Policy("domains/netDom~", "");
  Policy("domains/appDom", "-s open grant\n-s open grant\n");
  EXPECT_EQ(Check().status, 0);
  EXPECT_EQ(Check({"--error-on-warning"}).status, 1);
  EXPECT_EQ(Check({"--error-on-warning", "--no-warn", "backup-file"}).status, 1);
  const Result none =
      Check({"--error-on-warning", "--no-warn", "backup-file", "--no-warn", "repeated-rule"});
  EXPECT_EQ(none.status, 0);
  EXPECT_EQ(none.err, "0 errors, 0 warnings in 8 files\n");
}

TEST_F(ReportFormsTest, ErrorsAreNotSilenced) {
  Policy("fileLabels/base", "/none conf\n/usr/bin/ls program\n");
  EXPECT_EQ(Check({"--no-warn", "missing-path"}).status, 1);
}

TEST_F(ReportFormsTest, WrongUsage) {
  const Result unknown = Check({"--no-warn", "nonsense"});
  EXPECT_EQ(unknown.status, 2);
  EXPECT_THAT(unknown.err, HasSubstr("no warning has the id nonsense; known are: backup-file, "
                                     "carriage-return, contradictory-rule, "));
  EXPECT_EQ(Check({"--no-warn", "unknown-word"}).status, 2);
  EXPECT_EQ(Check({"--format", "xml"}).status, 2);
  EXPECT_EQ(Check({"--json", "--format", "text"}).status, 2);
}

TEST_F(ReportFormsTest, DirectoryThatIsNotThere) {
  const Result result = Command({"check", "--host", Host(), Path("none")});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.err, "Error: there is no policy directory " + Path("none") + "\n");
}

TEST_F(ReportFormsTest, NothingOfTheHostChanges) {
  Policy("domains/newDom", "-s open grant\n");
  (void)Check();
  EXPECT_THAT(Shown(), testing::Not(HasSubstr("newDom")));
}

}  // namespace
}  // namespace SecPolicyTool
