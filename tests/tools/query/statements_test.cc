// Statements about policies, as they are read, judged and told.
#include "tools/query/statements.h"

#include <sstream>

#include "tests/tools/query/policy_parts.h"
#include "tools/query/test_report.h"

namespace SecPolicyTool {
namespace {

using testing::ElementsAre;

Policy Tested() {
  Policy policy;
  policy.domains["appDom"] = DomainWith({"-s open grant", "-r /etc r"});
  policy.domains["rootDom"] = DomainWith({"-d program appDom exec grant"});
  policy.objects["program"] = {};
  return policy;
}

Vocabulary StatementWords() {
  Vocabulary words;
  words.lists = {{StandIn::WordList::kSyscalls, {"open", "read"}},
                 {StandIn::WordList::kObjects, {"program"}},
                 {StandIn::WordList::kObjectAccesses, {"read"}},
                 {StandIn::WordList::kTransitionEvents, {"exec", "fork"}}};
  words.domains = {"appDom", "rootDom"};
  return words;
}

StatementFile Parse(const std::string& text) {
  return ParseStatements(ReadPolicyText(text), StatementWords(), [](const std::string& path) {
    return StandIn::FileObject{path, std::nullopt};
  });
}

TestRun RunOf(const Policy& policy, const std::string& text) {
  TestRun run{"checks", "policy", Parse(text).statements, {}};
  run.outcomes = Judge(policy, run.statements);
  return run;
}

std::string Text(const std::string& text) {
  const Policy policy = Tested();
  std::ostringstream out;
  PrintText(RunOf(policy, text), Painter(false), out);
  return out.str();
}

TEST(StatementsTest, LinesAreReadAsPolicyFilesAre) {
  const StatementFile file =
      Parse("# comment\n\n  may   appDom syscall open# open\nnever appDom read /etc\n");
  std::vector<std::string> shown;
  for (const Statement& each : file.statements) {
    shown.push_back(std::to_string(each.line) + " " + each.text);
  }
  EXPECT_THAT(shown, ElementsAre("3 may appDom syscall open", "4 never appDom read /etc"));
  EXPECT_TRUE(file.problems.empty());
}

TEST(StatementsTest, EveryMistakeIsNamedWithItsPlace) {
  struct Row {
    const char* line;
    unsigned int column;
    const char* text;
  };
  const std::vector<Row> rows{
      {"  maybe appDom syscall open", 3, "unknown statement \"maybe\""},
      {"nevr appDom syscall open", 1, "unknown statement \"nevr\" (nearest: never)"},
      {"may", 1, "may takes other words: may DOMAIN OPERATION OBJECT..."},
      {"may appDom syscall", 1, "may takes other words: may DOMAIN OPERATION OBJECT..."},
      {"never appDom", 1, "never takes other words: never DOMAIN OPERATION OBJECT..."},
      {"reaches appDom", 1, "reaches takes other words: reaches FROM TO [EVENT]"},
      {"unreachable a b exec c", 1, "unreachable takes other words: unreachable FROM TO [EVENT]"},
      {"may apDom syscall open", 5, "unknown domain \"apDom\" (nearest: appDom)"},
      {"may appDom  syscal open", 13, "unknown operation \"syscal\" (nearest: syscall)"},
      {"may appDom syscall opn", 20, "unknown system call \"opn\" (nearest: open)"},
      {"may appDom syscall open read", 12, "syscall takes other words: syscall NAME"},
      {"reaches rotDom appDom", 9, "unknown domain \"rotDom\" (nearest: rootDom)"},
      {"reaches rootDom x", 17, "unknown domain \"x\""},
      {"reaches rootDom appDom exe", 24, "unknown transition event \"exe\" (nearest: exec)"},
  };
  std::string text;
  for (const Row& row : rows) text += std::string(row.line) + "\n";
  const StatementFile file = Parse(text + "may appDom syscall open\n");
  ASSERT_EQ(file.problems.size(), rows.size());
  for (std::size_t i = 0; i < rows.size(); ++i) {
    EXPECT_EQ(file.problems[i].line, i + 1) << rows[i].line;
    EXPECT_EQ(file.problems[i].column, rows[i].column) << rows[i].line;
    EXPECT_EQ(file.problems[i].text, rows[i].text) << rows[i].line;
  }
  EXPECT_EQ(file.statements.size(), 1U);
}

TEST(StatementsTest, LineThatHidesOthersIsAMistake) {
  const StatementFile file =
      Parse("may appDom syscall open #" + std::string(1000, '-') + "\nmay appDom syscall open\n");
  ASSERT_EQ(file.problems.size(), 1U);
  EXPECT_EQ(file.problems[0].text,
            "the line is longer than 1023 bytes; what is behind it is not read");
}

TEST(StatementsTest, WhatHoldsIsCounted) {
  EXPECT_EQ(Text("may appDom syscall open\n"
                 "never appDom syscall read\n"
                 "may appDom read /etc/motd\n"
                 "never appDom write /etc/motd\n"
                 "reaches rootDom appDom\n"
                 "reaches rootDom appDom exec\n"
                 "reaches appDom appDom fork\n"
                 "unreachable rootDom appDom fork\n"
                 "unreachable appDom rootDom\n"),
            "9 statements, 0 failed\n");
}

TEST(StatementsTest, WhatDoesNotHoldIsSaidWithItsReason) {
  EXPECT_EQ(Text("never appDom syscall open\n"
                 "may appDom syscall read\n"
                 "may appDom write /etc/motd\n"
                 "unreachable rootDom appDom\n"
                 "unreachable appDom appDom\n"
                 "reaches rootDom appDom fork\n"),
            "checks:1: expected \"never appDom syscall open\", but yes: -s open grant "
            "(policy:1:1)\n"
            "checks:2: expected \"may appDom syscall read\", but no: no rule\n"
            "checks:3: expected \"may appDom write /etc/motd\", but no: -r /etc r (policy:2:1)\n"
            "checks:4: expected \"unreachable rootDom appDom\", but rootDom -> appDom: "
            "-d program appDom exec grant (policy:1:1)\n"
            "checks:5: expected \"unreachable appDom appDom\", but the same domain\n"
            "checks:6: expected \"reaches rootDom appDom fork\", but no way\n"
            "6 statements, 6 failed\n");
}

TEST(StatementsTest, EveryStepOfAWayIsTold) {
  Policy policy = Tested();
  policy.domains["appDom"].rules.push_back(RuleOf("-d program endDom fork grant"));
  policy.domains["endDom"] = {};
  Statement statement;
  statement.kind = StatementKind::kUnreachable;
  statement.domain = "rootDom";
  statement.target = "endDom";
  const std::vector<Outcome> outcomes = Judge(policy, {statement});
  EXPECT_EQ(OutcomeText(statement, outcomes[0]),
            "rootDom -> appDom: -d program appDom exec grant (policy:1:1), "
            "appDom -> endDom: -d program endDom fork grant");
}

TEST(StatementsTest, ColoursSayHowItEnded) {
  const Policy policy = Tested();
  std::ostringstream out;
  PrintText(RunOf(policy, "may appDom syscall open\n"), Painter(true), out);
  PrintText(RunOf(policy, "may appDom syscall read\n"), Painter(true), out);
  EXPECT_EQ(out.str(),
            "\x1b[32m1 statements, 0 failed\x1b[0m\n"
            "checks:1: \x1b[31mexpected\x1b[0m \"may appDom syscall read\", but no: no rule\n"
            "\x1b[31m1 statements, 1 failed\x1b[0m\n");
}

TEST(StatementsTest, TapHasALineForEach) {
  const Policy policy = Tested();
  std::ostringstream out;
  PrintTap(RunOf(policy, "may appDom syscall open\nmay appDom syscall read\n"), out);
  EXPECT_EQ(out.str(),
            "TAP version 13\n1..2\nok 1 - may appDom syscall open\n"
            "not ok 2 - may appDom syscall read\n# checks:2: no: no rule\n");
}

}  // namespace
}  // namespace SecPolicyTool
