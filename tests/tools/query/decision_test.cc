// What a policy decides, for every type of rules.
#include "tools/query/decision.h"

#include <stdexcept>

#include "tests/tools/query/policy_parts.h"

namespace SecPolicyTool {
namespace {

// The words of the lists of a host, and a few objects and domains.
Vocabulary Words() {
  using StandIn::WordList;
  Vocabulary vocabulary;
  vocabulary.lists = {{WordList::kObjects, {"conf", "program", "socket"}},
                      {WordList::kCapabilities, {"sys_admin", "net_bind_service"}},
                      {WordList::kParamCapabilities, {"net_bind_service"}},
                      {WordList::kObjectAccesses, {"read", "write", "append", "exec", "connect"}},
                      {WordList::kTransitionEvents, {"exec", "fork"}},
                      {WordList::kFileTypes, {"file", "dir"}},
                      {WordList::kSocketTypes, {"stream", "dgram"}},
                      {WordList::kSyscalls, {"open", "read", "ptrace"}}};
  vocabulary.domains = {"appDom", "netDom"};
  return vocabulary;
}

Question Ask(const std::string& text) {
  std::vector<std::string> words;
  for (const LineWord& word : WordsOf(text)) words.push_back(word.text);
  return ParseQuestion(words, Words(), [](const std::string& path) -> StandIn::FileObject {
    if (path.starts_with("/none")) return {path, std::nullopt};
    return {path, path.starts_with("/srv") ? "conf" : "default"};
  });
}

std::string TextFor(const DomainDecisions& decisions, const std::string& text) {
  const Question question = Ask(text);
  return AnswerText(question, decisions.Decide(question)).Text();
}

DomainContent Domain() {
  return DomainWith({
      "-a conf read grant",
      "-a conf write revoke",
      "-c sys_admin grant",
      "-c net_bind_service revoke",
      "-d program netDom exec grant",
      "-d program netDom fork revoke",
      "-f conf program file grant",
      "-f conf program dir revoke",
      "-p net_bind_service 443 grant",
      "-p net_bind_service 80 revoke",
      "-r / r",
      "-r /var/log rw",
      "-r /var/log/secret",
      "-r /usr/bin rx",
      "-s open grant",
      "-s ptrace revoke",
      "-u socket stream grant",
      "-u socket dgram revoke",
  });
}

TEST(DecisionTest, TheRuleThatSpeaksDecides) {
  struct Row {
    const char* question;
    const char* answer;
  };
  const Policy policy{{{"appDom", Domain()}}, {}, {}, {}, {}};
  for (const Row& row : {
           Row{"read conf", "yes: -a conf read grant (policy:1:1)"},
           Row{"write conf", "no: -a conf write revoke (policy:2:1)"},
           Row{"append conf", "no: no rule"},
           Row{"read program", "no: no rule"},
           Row{"capability sys_admin", "yes: -c sys_admin grant (policy:3:1)"},
           Row{"capability net_bind_service", "no: -c net_bind_service revoke (policy:4:1)"},
           Row{"transition exec program netDom", "yes: -d program netDom exec grant (policy:5:1)"},
           Row{"transition fork program netDom", "no: -d program netDom fork revoke (policy:6:1)"},
           Row{"transition exec program appDom", "no: no rule"},
           Row{"create file conf program", "yes: -f conf program file grant (policy:7:1)"},
           Row{"create dir conf program", "no: -f conf program dir revoke (policy:8:1)"},
           Row{"create file program conf", "no: no rule"},
           Row{"capability net_bind_service 443",
               "yes: -p net_bind_service 443 grant (policy:9:1)"},
           Row{"capability net_bind_service 80", "no: -p net_bind_service 80 revoke (policy:10:1)"},
           Row{"capability net_bind_service 81", "no: no rule"},
           Row{"read /etc/motd", "yes: -r / r (policy:11:1)"},
           Row{"write /etc/motd", "no: -r / r (policy:11:1)"},
           Row{"syscall open", "yes: -s open grant (policy:15:1)"},
           Row{"syscall ptrace", "no: -s ptrace revoke (policy:16:1)"},
           Row{"syscall read", "no: no rule"},
           Row{"socket stream socket", "yes: -u socket stream grant (policy:17:1)"},
           Row{"socket dgram socket", "no: -u socket dgram revoke (policy:18:1)"},
           Row{"socket stream conf", "no: no rule"},
       }) {
    const Question question = Ask(row.question);
    EXPECT_EQ(AnswerText(question, Decide(policy, "appDom", question)), row.answer) << row.question;
    EXPECT_EQ(AnswerText(question, Decisions(policy).Decide("appDom", question)), row.answer);
  }
}

TEST(DecisionTest, TheLongestPathDecides) {
  struct Row {
    const char* question;
    const char* answer;
  };
  const DomainContent domain = Domain();
  const DomainDecisions decisions(domain);
  for (const Row& row : {
           Row{"read /", "yes: -r / r (policy:11:1)"},
           Row{"write /var", "no: -r / r (policy:11:1)"},
           Row{"write /var/log", "yes: -r /var/log rw (policy:12:1)"},
           Row{"write /var/log/boot", "yes: -r /var/log rw (policy:12:1)"},
           Row{"write /var/log/a/b/c", "yes: -r /var/log rw (policy:12:1)"},
           Row{"exec /var/log/boot", "no: -r /var/log rw (policy:12:1)"},
           Row{"write /var//log/", "yes: -r /var/log rw (policy:12:1)"},
           Row{"write /var/logs", "no: -r / r (policy:11:1)"},
           Row{"read /var/log/secret", "no: -r /var/log/secret (policy:13:1)"},
           Row{"read /var/log/secret/x", "no: -r /var/log/secret (policy:13:1)"},
           Row{"read /var/log/secrets", "yes: -r /var/log rw (policy:12:1)"},
           Row{"exec /usr/bin/ls", "yes: -r /usr/bin rx (policy:14:1)"},
           Row{"write /usr/bin/ls", "no: -r /usr/bin rx (policy:14:1)"},
       }) {
    EXPECT_EQ(TextFor(decisions, row.question), row.answer) << row.question;
  }
}

TEST(DecisionTest, WithoutARuleForAllPathsSomeHaveNone) {
  const DomainContent domain = DomainWith({"-r /var/log rw"});
  const DomainDecisions decisions(domain);
  EXPECT_EQ(TextFor(decisions, "read /etc"), "no: no rule for the path or the label default");
  EXPECT_EQ(TextFor(decisions, "read /"), "no: no rule for the path or the label default");
  EXPECT_EQ(TextFor(decisions, "read /none"), "no: no rule for the path");
}

TEST(DecisionTest, WhereNoPathRuleSpeaksTheFilesLabelDecides) {
  struct Row {
    const char* question;
    const char* answer;
  };
  const DomainContent domain = DomainWith({
      "-a conf read grant",
      "-a conf write revoke",
      "-a conf connect grant",
      "-r /srv/private",
      "-d conf netDom exec grant",
      "-a conf exec grant",
  });
  const DomainDecisions decisions(domain);
  for (const Row& row : {
           Row{"read /srv/x", "yes: -a conf read grant (policy:1:1)"},
           Row{"write /srv/x", "no: -a conf write revoke (policy:2:1)"},
           Row{"append /srv/x", "no: no rule for the path or the label conf"},
           Row{"read /srv/private/x", "no: -r /srv/private (policy:4:1)"},
           // No letter stands for it, so that a path rule cannot speak of it.
           Row{"connect /srv/private/x", "yes: -a conf connect grant (policy:3:1)"},
           Row{"exec /srv/x",
               "yes: -a conf exec grant (policy:6:1); continues in netDom: "
               "-d conf netDom exec grant (policy:5:1)"},
           Row{"exec /srv/private/x", "no: -r /srv/private (policy:4:1)"},
           Row{"exec conf", "yes: -a conf exec grant (policy:6:1)"},
       }) {
    EXPECT_EQ(TextFor(decisions, row.question), row.answer) << row.question;
  }
}

TEST(DecisionTest, SlashAtTheEndOfARulesPathDoesNotCount) {
  const DomainContent domain = DomainWith({"-r /srv/ r"});
  EXPECT_EQ(TextFor(DomainDecisions(domain), "read /srv/x"), "yes: -r /srv/ r (policy:1:1)");
}

TEST(DecisionTest, RulesForOneWorldDecideNothingForTheirDomain) {
  DomainContent domain = DomainWith({"-r /etc r", "-r /etc rw"});
  domain.rules[1].key.world = 4711;
  EXPECT_EQ(TextFor(DomainDecisions(domain), "write /etc/motd"), "no: -r /etc r (policy:1:1)");
}

TEST(DecisionTest, UnknownDomainIsRefused) {
  EXPECT_THROW(Decide({}, "noDom", Ask("syscall open")), std::out_of_range);
  EXPECT_THROW((void)Decisions({}).Decide("noDom", Ask("syscall open")), std::out_of_range);
}

TEST(DecisionTest, PlaceIsLeftOutWhenItIsNotKnown) {
  const PolicyRule rule = RuleOf("-s open grant");
  EXPECT_EQ(AnswerText({}, {true, &rule}), "yes: -s open grant");
}

// ---- Questions that are none ----

TEST(QuestionTest, MistakesAreNamedWithTheirWord) {
  struct Row {
    const char* question;
    std::size_t word;
    const char* text;
  };
  for (const Row& row : {
           Row{"syscal open", 0, "unknown operation \"syscal\" (nearest: syscall)"},
           Row{"raed conf", 0, "unknown operation \"raed\" (nearest: read)"},
           Row{"frobnicate conf", 0, "unknown operation \"frobnicate\""},
           Row{"raed cnf", 0, "unknown operation \"raed\" (nearest: read)"},
           Row{"raed /etc", 0, "unknown operation \"raed\" (nearest: read)"},
           Row{"read cnf", 1, "unknown object label \"cnf\" (nearest: conf)"},
           Row{"syscall opn", 1, "unknown system call \"opn\" (nearest: open)"},
           Row{"capability sysadmin", 1, "unknown capability \"sysadmin\" (nearest: sys_admin)"},
           Row{"capability sys_admin 1", 1, "unknown capability with parameter \"sys_admin\""},
           Row{"create fil conf program", 1, "unknown file type \"fil\" (nearest: file)"},
           Row{"create file cnf program", 2, "unknown object label \"cnf\" (nearest: conf)"},
           Row{"create file conf prgram", 3, "unknown object label \"prgram\" (nearest: program)"},
           Row{"create fil cnf prgram", 1, "unknown file type \"fil\" (nearest: file)"},
           Row{"socket steam conf", 1, "unknown socket type \"steam\" (nearest: stream)"},
           Row{"socket stream cnf", 2, "unknown object label \"cnf\" (nearest: conf)"},
           Row{"transition exe program netDom", 1,
               "unknown transition event \"exe\" (nearest: exec)"},
           Row{"transition exec prgram netDom", 2,
               "unknown object label \"prgram\" (nearest: program)"},
           Row{"transition exec program netDm", 3, "unknown domain \"netDm\" (nearest: netDom)"},
           Row{"transition exec program frobnicate", 3, "unknown domain \"frobnicate\""},
       }) {
    try {
      Ask(row.question);
      ADD_FAILURE() << row.question << " was accepted";
    } catch (const BadQuestion& problem) {
      EXPECT_STREQ(problem.what(), row.text) << row.question;
      EXPECT_EQ(problem.Word(), row.word) << row.question;
      EXPECT_EQ(problem.Of(), BadQuestion::Kind::kWord) << row.question;
    }
  }
}

TEST(QuestionTest, WrongFormsCanBeToldWithoutWords) {
  struct Row {
    std::vector<std::string> words;
    const char* text;
  };
  for (const Row& row : {
           Row{{"syscall"}, "syscall takes other words: syscall NAME"},
           Row{{"syscall", "a", "b"}, "syscall takes other words: syscall NAME"},
           Row{{"capability"},
               "capability takes other words: capability NAME or capability NAME PARAM"},
           Row{{"create", "file"}, "create takes other words: create TYPE PARENT LABEL"},
           Row{{"socket", "stream"}, "socket takes other words: socket TYPE LABEL"},
           Row{{"transition", "exec"},
               "transition takes other words: transition EVENT LABEL TARGET"},
           Row{{"read"}, "read is no operation with 0 words"},
           Row{{"read", "a", "b"}, "read is no operation with 2 words"},
           Row{{"creat", "file", "a", "b"}, "creat is no operation with 3 words (nearest: create)"},
       }) {
    try {
      CheckForm(row.words);
      ADD_FAILURE() << row.text << " did not come";
    } catch (const BadQuestion& problem) {
      EXPECT_STREQ(problem.what(), row.text);
      EXPECT_EQ(problem.Of(), BadQuestion::Kind::kForm);
    }
    EXPECT_THROW(ParseQuestion(row.words, Words(), nullptr), BadQuestion) << row.text;
  }
}

TEST(QuestionTest, PathIsWhatItResolvesTo) {
  const Question question = ParseQuestion(
      {"exec", "/bin/ls"}, Words(), [](const std::string& path) -> StandIn::FileObject {
        return {path == "/bin/ls" ? "/usr/bin/ls" : "", "program"};
      });
  EXPECT_EQ(question.key, (RuleKey{RuleType::kPath, {"/usr/bin/ls"}, 0}));
  EXPECT_EQ(question.file->access, "exec");
  EXPECT_EQ(question.file->object.path, "/usr/bin/ls");
  EXPECT_EQ(question.file->object.label, "program");
}

TEST(QuestionTest, CreateOfAPathIsAnAccess) {
  EXPECT_EQ(Ask("create /etc").file->access, "create");
  EXPECT_EQ(Ask("create file conf program").file, std::nullopt);
  EXPECT_THROW(Ask("socket /etc"), BadQuestion);
}

}  // namespace
}  // namespace SecPolicyTool
