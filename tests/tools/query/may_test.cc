// Asking what a domain may do, and which domains may do something.
#include <filesystem>
#include <nlohmann/json.hpp>

#include "tests/tools/query/query_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

using testing::StartsWith;

class MayTest : public QueryTest {
 protected:
  Result Ask(const std::string& verb, Arguments question) const {
    question.insert(question.begin(), {"--policy", PolicyDir()});
    return Verb(verb, question);
  }
};

TEST_F(MayTest, AnswerNamesTheDecidingRule) {
  struct Row {
    Arguments question;
    int status;
    const char* answer;
  };
  for (const Row& row : {
           Row{{"netDom", "syscall", "open"}, 0, "yes: -s open grant (policy/domains/netDom:2:1)"},
           Row{{"netDom", "syscall", "ptrace"},
               1,
               "no: -s ptrace revoke (policy/domains/netDom:3:1)"},
           Row{{"netDom", "syscall", "close"}, 1, "no: no rule"},
           Row{{"netDom", "read", "conf"},
               0,
               "yes: -a conf read grant (policy/domains/netDom:4:1)"},
           Row{{"netDom", "write", "/etc/hosts"}, 1, "no: -r /etc r (policy/domains/netDom:6:1)"},
           Row{{"netDom", "read", "/etc/shadow"},
               1,
               "no: -r /etc/shadow (policy/domains/netDom:7:1)"},
           Row{{"netDom", "capability", "net_bind_service", "443"},
               0,
               "yes: -p net_bind_service 443 grant (policy/domains/netDom:5:1)"},
           Row{{"rootDom", "transition", "exec", "tardisk", "appDom"},
               0,
               "yes: -d tardisk appDom exec grant"},
       }) {
    const Result result = Ask("may", row.question);
    EXPECT_EQ(result.status, row.status) << row.answer;
    EXPECT_EQ(Short(result.out), std::string(row.answer) + "\n");
    EXPECT_EQ(result.err, "");
  }
}

TEST_F(MayTest, PathsAreResolvedAsTheHostHasThem) {
  struct Row {
    const char* path;
    const char* answer;
  };
  constexpr char kLs[] = "yes: -r /usr/bin/ls rx (policy/domains/netDom:8:1)\n";
  for (const Row& row : {
           Row{"/bin/ls", kLs},
           Row{"/usr/bin/ls", kLs},
           Row{"/etc/../bin//ls", kLs},
           Row{"/../../bin/ls", kLs},
           // Nothing is there, so it stays as it is, as that of a rule does.
           Row{"/bin/none", "no: no rule for the path\n"},
           Row{"/etc/none", "no: -r /etc r (policy/domains/netDom:6:1)\n"},
           Row{"/", "no: no rule for the path or the label default\n"},
       }) {
    EXPECT_EQ(Short(Ask("may", {"netDom", "exec", row.path}).out), row.answer) << row.path;
  }
}

TEST_F(MayTest, KernelIsAskedUnlessAPolicyIsNamed) {
  EXPECT_EQ(Verb("may", {"rootDom", "syscall", "open"}).out, "no: no rule\n");
  ASSERT_EQ(Load().status, 0);
  const Result result = Verb("may", {"appDom", "syscall", "open"});
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.out, "yes: -s open grant (line 1)\n");
  EXPECT_EQ(Verb("may", {"appDom", "exec", "/bin/ls"}).out, "yes: -r /usr rx\n");
}

TEST_F(MayTest, HostWithoutFilesTakesPathsAsTheyAre) {
  std::filesystem::remove_all(Host());
  Done({"host", "init", Host()});
  const Result result = Verb("may", {"rootDom", "read", "/bin/ls"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.out, "no: no rule for the path\n");
}

class MayOnLabelledFilesTest : public MayTest {
 protected:
  MayOnLabelledFilesTest() {
    Policy("fileLabels/base", "/etc/net/* conf\n/usr/bin/ls program\n");
    Policy("domains/netDom",
           "-a conf read grant\n-a conf write revoke\n-a default getattr grant\n-r /etc/net/b\n"
           "-a program exec grant\n-d program appDom exec grant\n");
  }

  // With a directory for tardisk policies, without which tardisks are not labelled.
  void SetUp() override {
    StandIn::Archive base = Base();
    base.Directory("etc/olvane/secpolicy/tardisks");
    MakeHost({{"base.tar", base}});
  }
};

TEST_F(MayOnLabelledFilesTest, TheLabelOfAFileDecidesWhereNoPathRuleSpeaks) {
  struct Row {
    Arguments question;
    const char* answer;
  };
  for (const Row& row : {
           Row{{"netDom", "read", "/etc/net/a"},
               "yes: -a conf read grant (policy/domains/netDom:1:1)"},
           Row{{"netDom", "read", "/etc/net/link"},
               "yes: -a conf read grant (policy/domains/netDom:1:1)"},
           Row{{"netDom", "write", "/etc/net/a"},
               "no: -a conf write revoke (policy/domains/netDom:2:1)"},
           Row{{"netDom", "append", "/etc/net/a"}, "no: no rule for the path or the label conf"},
           Row{{"netDom", "read", "/etc/net/b"}, "no: -r /etc/net/b (policy/domains/netDom:4:1)"},
           Row{{"netDom", "getattr", "/etc/hosts"},
               "yes: -a default getattr grant (policy/domains/netDom:3:1)"},
           Row{{"netDom", "getattr", "/etc/none"}, "no: no rule for the path"},
           Row{{"netDom", "getattr", "/tardisks/base.tar"},
               "no: no rule for the path or the label tardisk"},
           Row{{"netDom", "exec", "/bin/ls"},
               "yes: -a program exec grant (policy/domains/netDom:5:1); continues in appDom: "
               "-d program appDom exec grant (policy/domains/netDom:6:1)"},
       }) {
    const Result result = Ask("may", row.question);
    EXPECT_EQ(Short(result.out), std::string(row.answer) + "\n") << row.question.back();
    EXPECT_EQ(result.status, std::string_view(row.answer).starts_with("yes") ? 0 : 1);
    EXPECT_EQ(result.err, "");
  }
}

TEST_F(MayOnLabelledFilesTest, TheKernelsLabelsAreAskedForAsWell) {
  EXPECT_EQ(Load().status, 0);
  EXPECT_EQ(Verb("may", {"netDom", "read", "/etc/net/a"}).out,
            "yes: -a conf read grant (line 1)\n");
}

TEST_F(MayOnLabelledFilesTest, WhoListsRulesOfEitherType) {
  Policy("domains/appDom", "-r /etc r\n");
  EXPECT_EQ(Short(Ask("who", {"read", "/etc/net/a"}).out),
            "appDom: -r /etc r (policy/domains/appDom:1:1)\n"
            "netDom: -a conf read grant (policy/domains/netDom:1:1)\n");
}

TEST_F(MayOnLabelledFilesTest, JsonHasTheLabelAndTheTransition) {
  const Result result = Ask("may", {"--json", "netDom", "exec", "/bin/ls"});
  EXPECT_EQ(JsonProblem(result.out, "may"), "");
  const auto answer = nlohmann::json::parse(result.out);
  EXPECT_EQ(answer["type"], "-r");
  EXPECT_EQ(answer["path"], "/usr/bin/ls");
  EXPECT_EQ(answer["label"], "program");
  EXPECT_EQ(answer["rule"]["type"], "-a");
  EXPECT_EQ(answer["transition"]["line"], "-d program appDom exec grant");
  const Result none = Ask("may", {"--json", "netDom", "getattr", "/etc/none"});
  EXPECT_EQ(JsonProblem(none.out, "may"), "");
  EXPECT_EQ(nlohmann::json::parse(none.out)["label"], nullptr);
  EXPECT_EQ(nlohmann::json::parse(none.out)["transition"], nullptr);
  const Result who = Ask("who", {"--json", "exec", "/bin/ls"});
  EXPECT_EQ(JsonProblem(who.out, "who"), "");
  EXPECT_EQ(nlohmann::json::parse(who.out)["label"], "program");
}

TEST_F(MayOnLabelledFilesTest, StatementsAskTheSame) {
  const std::string file = Path("checks");
  StandIn::WriteBytes(
      file,
      "may netDom read /etc/net/a\nnever netDom write /etc/net/a\nmay netDom read /etc/hosts\n");
  const Result result = Verb("test", {"--policy", PolicyDir(), file});
  EXPECT_EQ(Short(result.out),
            file +
                ":3: expected \"may netDom read /etc/hosts\", but no: no rule for the path or the "
                "label default\n3 statements, 1 failed\n");
}

TEST_F(MayTest, UnknownWordsAreErrors) {
  struct Row {
    Arguments question;
    const char* error;
  };
  for (const Row& row : {
           Row{{"apDom", "syscall", "open"}, "unknown domain \"apDom\" (nearest: appDom)"},
           Row{{"appDom", "syscall", "opn"}, "unknown system call \"opn\" (nearest: open)"},
           Row{{"appDom", "raed", "conf"}, "unknown operation \"raed\" (nearest: read)"},
           Row{{"appDom", "read", "cnf"}, "unknown object label \"cnf\" (nearest: conf)"},
       }) {
    const Result result = Ask("may", row.question);
    EXPECT_EQ(result.status, 1) << row.error;
    EXPECT_EQ(result.out, "") << row.error;
    EXPECT_EQ(result.err, std::string("Error: ") + row.error + "\n");
  }
}

TEST_F(MayTest, WrongNumberOfWordsIsWrongUsage) {
  for (const Arguments& question :
       {Arguments{}, Arguments{"appDom"}, Arguments{"appDom", "syscall"},
        Arguments{"appDom", "create", "file"}, Arguments{"appDom", "socket", "/etc"}}) {
    const Result result = Ask("may", question);
    EXPECT_EQ(result.status, 2) << question.size();
    EXPECT_EQ(result.out, "");
  }
  EXPECT_THAT(Ask("may", {"appDom", "create", "file"}).err,
              StartsWith("OPERATION: create takes other words: create TYPE PARENT LABEL\n"));
  EXPECT_EQ(Ask("who", {"create", "file"}).status, 2);
}

TEST_F(MayTest, HelpListsTheQuestions) {
  for (const char* verb : {"may", "who"}) {
    EXPECT_THAT(Done({verb, "--help"}).out,
                testing::HasSubstr("  ACCESS PATH\n  ACCESS LABEL\n  capability NAME\n"));
  }
}

TEST_F(MayTest, WhoListsTheDomainsThatMay) {
  const Result result = Ask("who", {"syscall", "open"});
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(Short(result.out),
            "appDom: -s open grant (policy/domains/appDom:1:1)\n"
            "netDom: -s open grant (policy/domains/netDom:2:1)\n");
  const Result none = Ask("who", {"syscall", "ptrace"});
  EXPECT_EQ(none.status, 1);
  EXPECT_EQ(none.out + none.err, "");
  EXPECT_EQ(Ask("who", {"syscall", "opn"}).status, 1);
}

TEST_F(MayTest, JsonIsAsDescribed) {
  for (const Arguments& question :
       {Arguments{"netDom", "syscall", "open"}, Arguments{"netDom", "syscall", "close"},
        Arguments{"netDom", "exec", "/bin/ls"}}) {
    Arguments arguments{"--json"};
    arguments.insert(arguments.end(), question.begin(), question.end());
    const Result may = Ask("may", arguments);
    EXPECT_EQ(JsonProblem(may.out, "may"), "");
    const auto answer = nlohmann::json::parse(may.out);
    EXPECT_EQ(answer["allowed"], may.status == 0);
    arguments.erase(arguments.begin() + 1);
    const Result who = Ask("who", arguments);
    EXPECT_EQ(JsonProblem(who.out, "who"), "");
    EXPECT_EQ(nlohmann::json::parse(who.out)["domains"].empty(), who.status == 1);
  }
  const auto answer =
      nlohmann::json::parse(Ask("may", {"--json", "netDom", "exec", "/bin/ls"}).out);
  EXPECT_EQ(answer["path"], "/usr/bin/ls");
  EXPECT_EQ(answer["rule"]["permission"], "rx");
  EXPECT_EQ(answer["rule"]["place"]["line"], 8);
}

}  // namespace
}  // namespace SecPolicyTool
