// Finding rules.
#include "tools/query/search.h"

#include "tests/tools/query/policy_parts.h"
#include "tests/tools/query/query_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;

class SearchTest : public QueryTest {
 protected:
  std::string Found(Arguments terms) const {
    terms.insert(terms.begin(), PolicyDir());
    return Printed("search", terms);
  }
};

TEST_F(SearchTest, TermsNarrowWhatIsFound) {
  struct Row {
    Arguments terms;
    const char* found;
  };
  constexpr char kOpen[] =
      "policy/domains/appDom:1: -s open grant\npolicy/domains/netDom:2: -s open grant\n";
  constexpr char kSyscalls[] =
      "policy/domains/netDom:2: -s open grant\npolicy/domains/netDom:3: -s ptrace revoke\n";
  for (const Row& row : {
           Row{{"--domain", "appDom"},
               "policy/domains/appDom:2: -r /usr rx\npolicy/domains/appDom:1: -s open grant\n"},
           Row{{"--domain", "netDom", "--type", "-s"}, kSyscalls},
           Row{{"--domain=netDom", "--type=-s"}, kSyscalls},
           Row{{"--domain", "netDom", "--type", "s"}, kSyscalls},
           Row{{"--domain", "netDom", "--type", "syscall"}, kSyscalls},
           Row{{"--domain", "netDom", "--type", "system call"}, kSyscalls},
           Row{{"--word", "open"}, kOpen},
           Row{{"--word", "^op", "--regex"}, kOpen},
           Row{{"--word", "net_.*", "--regex"},
               "policy/domains/netDom:5: -p net_bind_service 443 grant\n"},
           Row{{"--word", "443"}, "policy/domains/netDom:5: -p net_bind_service 443 grant\n"},
           Row{{"--revoked"},
               "policy/domains/netDom:7: -r /etc/shadow\n"
               "policy/domains/netDom:3: -s ptrace revoke\n"},
           Row{{"--granted", "--type", "path"},
               "policy/domains/appDom:2: -r /usr rx\n"
               "policy/domains/netDom:6: -r /etc r\n"
               "policy/domains/netDom:8: -r /usr/bin/ls rx\n"},
           Row{{"--type", "transition"},
               "policy/domains/rootDom:1: -d program netDom exec grant\n"
               "rootDom: -d tardisk appDom exec grant\n"},
       }) {
    EXPECT_EQ(Found(row.terms), row.found);
  }
}

TEST_F(SearchTest, PathRulesAreFoundThatDecideOnAPathOrAreBelowIt) {
  EXPECT_EQ(Found({"--path", "/etc/hosts"}), "policy/domains/netDom:6: -r /etc r\n");
  EXPECT_EQ(Found({"--path", "/etc/shadow"}), "policy/domains/netDom:7: -r /etc/shadow\n");
  EXPECT_EQ(Found({"--path", "/etc"}),
            "policy/domains/netDom:6: -r /etc r\npolicy/domains/netDom:7: -r /etc/shadow\n");
  // /bin is a link to /usr/bin.
  EXPECT_EQ(Found({"--path", "/bin"}),
            "policy/domains/appDom:2: -r /usr rx\npolicy/domains/netDom:8: -r /usr/bin/ls rx\n");
  EXPECT_EQ(Found({"--path", "/tmp"}), "");
}

TEST_F(SearchTest, KernelsRulesHaveTheirDomain) {
  ASSERT_EQ(Load().status, 0);
  EXPECT_EQ(Printed("search", {"kernel", "--word", "open"}),
            "appDom: -s open grant\nnetDom: -s open grant\n");
}

TEST_F(SearchTest, StatusSaysWhetherAnythingWasFound) {
  EXPECT_EQ(Verb("search", {PolicyDir(), "--word", "open"}).status, 0);
  const Result result = Verb("search", {PolicyDir(), "--word", "ope"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.out + result.err, "");
}

TEST_F(SearchTest, UnknownDomainIsAnError) {
  const Result result = Verb("search", {PolicyDir(), "--domain", "apDom"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.err, "Error: unknown domain \"apDom\" (nearest: appDom)\n");
}

TEST_F(SearchTest, WrongUsageIsNamed) {
  struct Row {
    Arguments terms;
    const char* error;
  };
  for (const Row& row : {
           Row{{"--type", "-q"}, "--type: no type of rules is called \"-q\"\n"},
           Row{{"--word", "(", "--regex"}, "--word: \"(\" is no regular expression: missing ): ("},
           Row{{"--word", "(a)\\1", "--regex"},
               "--word: \"(a)\\1\" is no regular expression: invalid escape sequence: \\1"},
           Row{{"--word", "\xff", "--regex"},
               "--word: \"\\xff\" is no regular expression: invalid UTF-8"},
           Row{{"--word", "((a{200}){200}){200}", "--regex"},
               "--word: \"((a{200}){200}){200}\" is no regular expression: "},
           Row{{"--type", "\x1b[2J"}, "--type: no type of rules is called \"\\x1b[2J\"\n"},
           Row{{"--regex"}, "--regex requires --word\n"},
           Row{{"--path", "etc"}, "--path: not an absolute path: \"etc\"\n"},
           Row{{"--granted", "--revoked"}, "--"},
       }) {
    Arguments terms = row.terms;
    terms.insert(terms.begin(), PolicyDir());
    const Result result = Verb("search", terms);
    EXPECT_EQ(result.status, 2) << row.error;
    EXPECT_EQ(result.out, "") << row.error;
    EXPECT_THAT(result.err, StartsWith(row.error));
  }
}

TEST_F(SearchTest, RegularExpressionIsBounded) {
  for (const std::string& pattern :
       {std::string(60000, '('), std::string(60000, '(') + std::string(60000, ')'),
        std::string(100000, 'a'), std::string(1001, 'a')}) {
    const Result result = Verb("search", {PolicyDir(), "--word", pattern, "--regex"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.err, "--word: the regular expression has " + std::to_string(pattern.size()) +
                              " bytes, and at most 1000 are allowed\n"
                              "Run with --help for more information.\n");
  }
  EXPECT_EQ(Verb("search", {PolicyDir(), "--word", std::string(1000, 'a'), "--regex"}).status, 1);
  const std::string nested = std::string(499, '(') + "op" + std::string(499, ')');
  EXPECT_EQ(Verb("search", {PolicyDir(), "--word", nested, "--regex"}).status, 0);
}

// An engine that backtracks would take years for it.
TEST_F(SearchTest, MatchIsTriedInTimeInProportionToTheWord) {
  Policy("domains/netDom", "-p net_admin " + std::string(900, 'a') + " grant\n");
  EXPECT_EQ(Found({"--word", "^(a*)*(a*)*(a*)*b$", "--regex"}), "");
}

TEST_F(SearchTest, JsonIsAsDescribed) {
  ASSERT_EQ(Load().status, 0);
  for (const std::string& source : {PolicyDir(), std::string("kernel")}) {
    const Result result = Verb("search", {source, "--json"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(JsonProblem(result.out, "search"), "");
    EXPECT_THAT(result.out, HasSubstr("\"permission\": \"rx\""));
  }
  const Result none = Verb("search", {PolicyDir(), "--word", "x", "--json"});
  EXPECT_EQ(none.status, 1);
  EXPECT_EQ(JsonProblem(none.out, "search"), "");
}

TEST(SearchOfWorldsTest, EveryWorldHasItsOwnDecidingRule) {
  SecPolicyTool::Policy policy;
  DomainContent& domain = policy.domains["appDom"];
  domain = DomainWith({"-r /etc r", "-r / r", "-r /etc/a rw", "-r /var r"});
  domain.rules[2].key.world = 7;
  SearchTerms terms;
  terms.path = "/etc/a/b";
  std::vector<std::string> found;
  for (const FoundRule& each : Search(policy, terms)) found.push_back(FoundText(each).Text());
  EXPECT_THAT(found, ElementsAre("policy:1: -r /etc r", "policy:3: -r /etc/a rw # world 7"));
}

}  // namespace
}  // namespace SecPolicyTool
