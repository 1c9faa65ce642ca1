// What is wrong with lines of domain files.
#include "tests/tools/check/check_fixture.h"

namespace SecPolicyTool {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class DomainLinesTest : public CheckTest {};

TEST_F(DomainLinesTest, GoodPolicyHasNoFindings) { EXPECT_THAT(Found(), IsEmpty()); }

struct Line {
  const char* text;
  std::vector<std::string> found;
};

const Line kLines[] = {
    {"-s opne grant", {"4: error: unknown system call \"opne\" (nearest: open) [unknown-word]"}},
    {"-s open Grant", {"9: error: invalid keyword Grant [bad-decision]"}},
    {"-s opne grnt",
     {"4: error: unknown system call \"opne\" (nearest: open) [unknown-word]",
      "9: error: invalid keyword grnt [bad-decision]"}},
    {"-S open grant", {"1: error: invalid policy rule type (-S) [unknown-rule-type]"}},
    {"  allow open grant", {"3: error: invalid policy rule type (allow) [unknown-rule-type]"}},
    {"-s open read grant",
     {"1: error: incorrect number of arguments for this rule type [word-count]"}},
    {"-a conf", {"1: error: incorrect number of arguments for this rule type [word-count]"}},
    {"-a Conf red grant",
     {"4: error: unknown object label \"Conf\" (nearest: conf) [unknown-word]",
      "9: error: unknown object access \"red\" (nearest: read) [unknown-word]"}},
    {"-c cap_kill grant", {"4: error: unknown capability \"cap_kill\" [unknown-word]"}},
    {"-p kil 1 grant",
     {"4: error: unknown capability with parameter \"kil\" (nearest: kill) [unknown-word]"}},
    {"-d progrm netDm exce revok",
     {"4: error: unknown object label \"progrm\" (nearest: program) [unknown-word]",
      "11: error: Failed to fetch domain id for: netDm [unknown-domain]",
      "17: error: unknown transition event \"exce\" (nearest: exec) [unknown-word]",
      "22: error: invalid keyword revok [bad-decision]"}},
    {"-f conf x fil grant",
     {"9: error: unknown object label \"x\" [unknown-word]",
      "11: error: unknown file type \"fil\" (nearest: file) [unknown-word]"}},
    {"-u conf steam grant",
     {"9: error: unknown socket type \"steam\" (nearest: stream) [unknown-word]"}},
    {"-r", {"1: error: incorrect number of arguments for this rule type [word-count]"}},
    {"-r /etc/motd r grant",
     {"1: error: incorrect number of arguments for this rule type [word-count]"}},
    {"-r /etc/motd R", {"14: error: Unknown access privilege specified. [bad-permission]"}},
    {"-r /etc/motd rr", {"14: error: Read access already specified. [bad-permission]"}},
    {"-r /etc/motd read", {"14: error: Please enter the permissions from [rwx]. [bad-permission]"}},
    {"-r etc/none r",
     {"4: error: Failed to add file policies to domain :1: world ID :0:Invalid argument "
      "[relative-path]"}},
    {"-r etc/motd r",
     {"4: warning: the path leads from the loading process's own directory, wherever that is "
      "[relative-path]"}},
    {"-r /none r",
     {"4: warning: the path cannot be resolved in the host: No such file or directory "
      "[missing-path]"}},
    {"-r /etc/motd/x r",
     {"4: warning: the path cannot be resolved in the host: Not a directory [missing-path]"}},
};

TEST_F(DomainLinesTest, EveryBadWordIsShown) {
  for (const Line& line : kLines) {
    // Behind a bad line, which ends the file for a load, too.
    for (const std::string before : {"", "-x\n"}) {
      Policy("domains/appDom", before + line.text + "\n-s close grant\n");
      const std::string number = before.empty() ? "1" : "2";
      std::vector<std::string> expected;
      if (!before.empty()) {
        expected.emplace_back(
            "domains/appDom:1:1: error: invalid policy rule type (-x) [unknown-rule-type]");
      }
      for (const std::string& found : line.found) {
        expected.push_back("domains/appDom:" + number + ":" + found);
      }
      EXPECT_EQ(Found(), expected) << line.text;
    }
  }
}

TEST_F(DomainLinesTest, LoadMessageIsWhatALoadReports) {
  for (const Line& line : kLines) {
    Policy("domains/appDom", std::string(line.text) + "\n");
    std::vector<std::string> messages;
    for (const Finding& finding : Findings()) {
      if (finding.severity == Severity::kError) messages.push_back(finding.loadMessage);
    }
    const std::vector<std::string> reported = LoadErrorsOf();
    if (messages.empty()) {
      EXPECT_THAT(reported, IsEmpty()) << line.text;
    } else {
      EXPECT_THAT(messages, testing::Contains(reported.at(0))) << line.text;
    }
  }
}

TEST_F(DomainLinesTest, HelpsSayWhatWouldBeRight) {
  const std::pair<const char*, const char*> kHelps[] = {
      {"-s opne grant", "did you mean \"open\"?"},
      {"-s nothing-like-it grant", ""},
      {"-s open Grant", "did you mean \"grant\"?"},
      {"-s open allow", "a rule ends in grant or revoke"},
      {"-S open grant", "did you mean \"-s\"?"},
      {"s open grant", "did you mean \"-s\"?"},
      {"-E conf appDom", "-E stands in the policy files of tardisks"},
      {"allow open grant", "the rule types are -a -c -d -f -p -r -s -u"},
      {"-s", "write: -s SYSTEM-CALL grant|revoke"},
      {"-f", "write: -f PARENT-LABEL FILE-LABEL FILE-TYPE grant|revoke"},
      {"-r", "write: -r PATH [r][w][x]"},
      {"-a nothing read grant", "define it in objects/"},
      {"-a conf peruse grant",
       "known are: append connect create delete exec getattr read rename setattr write"},
      {"-d program netDm exec grant", "did you mean \"netDom\"?"},
      {"-d program elsewhere exec grant", "make a file domains/elsewhere; it may be empty"},
  };
  for (const auto& [line, help] : kHelps) {
    Policy("domains/appDom", std::string(line) + "\n");
    const auto findings = Findings();
    ASSERT_EQ(findings.size(), 1U) << line;
    EXPECT_EQ(findings[0].help, help) << line;
  }
}

TEST_F(DomainLinesTest, SameBadWordGetsTheSameHelpTwice) {
  Policy("domains/appDom", "-d program netDm exec grant\n-d conf netDm exec grant\n");
  const auto findings = Findings();
  ASSERT_EQ(findings.size(), 2U);
  EXPECT_EQ(findings[0].help, findings[1].help);
}

TEST_F(DomainLinesTest, RulesThatRepeatAndContradict) {
  Policy("domains/appDom",
         "-s open grant\n"
         "-s open grant\n"
         "-s open revoke\n"
         "-r /bin/ls rx\n"
         "-r /usr/bin/ls xr\n"
         "-r /usr/bin/../bin/ls\n"
         "-r /etc/motd\n"
         "-r /etc/motd w\n");
  EXPECT_THAT(
      Found(),
      ElementsAre(
          "domains/appDom:2:1: warning: the line says what the one on line 1 says [repeated-rule]",
          "domains/appDom:3:9: warning: the line revokes what the one on line 2 grants; the later "
          "one wins [contradictory-rule]",
          "domains/appDom:5:1: warning: the line says what the one on line 4 says [repeated-rule]",
          "domains/appDom:6:4: warning: the line permits nothing for what the one on line 5 "
          "permits xr for; the later one wins [contradictory-rule]",
          "domains/appDom:8:14: warning: the line permits w for what the one on line 7 permits "
          "nothing for; the later one wins [contradictory-rule]"));
}

TEST_F(DomainLinesTest, ContradictoryParametersAreErrors) {
  Policy("domains/appDom",
         "-p kill 1 grant\n-p kill 2 revoke\n-p kill 1 revoke\n-p kill 1 grant\n"
         "-p kill 1 revoke\n-p kill 2 revoke\n");
  const std::string start =
      "error: the capability \"kill\" with the parameter \"1\" of the domain \"appDom\" is granted "
      "on line 1 and revoked on line ";
  EXPECT_THAT(Found(),
              ElementsAre("domains/appDom:3:11: " + start + "3 [contradictory-parameter]",
                          "domains/appDom:5:11: " + start + "5 [contradictory-parameter]",
                          "domains/appDom:6:1: warning: the line says what the one on line 2 says "
                          "[repeated-rule]"));
  EXPECT_EQ(Findings()[0].loadMessage, LoadErrorsOf().at(0));
}

TEST_F(DomainLinesTest, MissingDomainsAreAllNamed) {
  for (const char* domain : {"globalVMDom", "ioFilterDom", "appDom"}) {
    std::filesystem::remove(PolicyDir() + "/domains/" + domain);
  }
  Policy("domains/AppDom", "-s open grant\n");
  const auto findings = Findings();
  ASSERT_EQ(findings.size(), 4U);
  EXPECT_EQ(findings[0].loadMessage, "Failed to fetch domainID for global VM Domain");
  EXPECT_EQ(findings[0].place.file, PolicyDir() + "/domains");
  EXPECT_EQ(findings[0].help,
            "make a file " + PolicyDir() + "/domains/globalVMDom; it may be empty");
  EXPECT_EQ(findings[1].loadMessage, "Failed to fetch domainID for IOFilter domain");
  EXPECT_EQ(findings[2].loadMessage, "Failed to fetch domainID for default tar disk domain");
  EXPECT_EQ(findings[2].help, "is " + PolicyDir() + "/domains/AppDom to be named appDom?");
  EXPECT_EQ(findings[3].id, "unreachable-domain");
}

TEST_F(DomainLinesTest, NameThatTheKernelRefusesHidesNothing) {
  // In front of all others: the load reads no rule of any domain, and does not find appDom.
  const std::string name(128, 'A');
  Policy("domains/" + name, "-s open grant\n-s opne grant\n");
  Policy("domains/netDom", "-a conf red grant\n");
  EXPECT_THAT(
      Found(),
      ElementsAre("domains/" + name + ": error: the domain name \"" + name +
                      "\" is longer than 127 bytes [refused-name]",
                  "domains/" + name +
                      ": warning: no granted transition leads here from a domain in which "
                      "programs run [unreachable-domain]",
                  "domains/" + name +
                      ":2:4: error: unknown system call \"opne\" (nearest: open) [unknown-word]",
                  "domains/netDom:1:9: error: unknown object access \"red\" (nearest: read) "
                  "[unknown-word]"));
  EXPECT_EQ(Findings()[0].loadMessage, LoadErrorsOf().at(0));
}

}  // namespace
}  // namespace SecPolicyTool
