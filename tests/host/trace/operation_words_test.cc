// Operations' arguments in the words of policy files.
#include "host/trace/operation_words.h"

#include "tests/host/trace/trace_fixture.h"

namespace StandIn {
namespace {

TEST(OperationWordsTest, PermissionsAreLettersAndTheRestIsANumber) {
  struct Row {
    std::uint32_t permission;
    const char* word;
  };
  for (const Row& row : {Row{0, ""}, Row{0x1, "r"}, Row{0x2, "w"}, Row{0x10, "x"}, Row{0x13, "rwx"},
                         Row{0x4, "+4"}, Row{0x15, "rx+4"}, Row{0xffffffff, "rwx+4294967276"}})
    EXPECT_EQ(PermissionWord(row.permission), row.word) << row.permission;
}

TEST(OperationWordsTest, RulesAreLinesWithAComment) {
  struct Row {
    RuleType type;
    Rule rule;
    const char* words;
  };
  for (const Row& row :
       {Row{RuleType::kSyscall, {4, {"open"}, 0, Decision::kGrant}, "-s open grant # line 4"},
        Row{RuleType::kSyscall, {0, {"open"}, 0, Decision::kRevoke}, "-s open revoke"},
        Row{RuleType::kObjectAccess,
            {1, {"o", "read"}, 0, Decision::kGrant},
            "-a o read grant # line 1"},
        Row{RuleType::kCapability,
            {2, {"net_admin"}, 0, Decision::kRevoke},
            "-c net_admin revoke # line 2"},
        Row{RuleType::kCapabilityParam,
            {3, {"net_bind", "80"}, 0, Decision::kGrant},
            "-p net_bind 80 grant # line 3"},
        Row{RuleType::kTransition,
            {5, {"bin", "appDom", "exec"}, 7, Decision::kGrant},
            "-d bin appDom exec grant # line 5 into 7"},
        Row{RuleType::kTransition,
            {0, {"bin", "appDom", "exec"}, 0, Decision::kGrant},
            "-d bin appDom exec grant # into 0"},
        Row{RuleType::kFileCreation,
            {6, {"a", "b", "file"}, 0, Decision::kGrant},
            "-f a b file grant # line 6"},
        Row{RuleType::kUnixSocket,
            {8, {"sock", "stream"}, 0, Decision::kGrant},
            "-u sock stream grant # line 8"}}) {
    EXPECT_EQ(RuleWords(row.type, row.rule), row.words);
  }
}

TEST(OperationWordsTest, FileRulesAreLinesWithTheirWorld) {
  EXPECT_EQ(FileRuleWords({0, "/etc/motd", 0x3}), "-r /etc/motd rw");
  EXPECT_EQ(FileRuleWords({4711, "/etc/motd", 0x10}), "-r /etc/motd x # world 4711");
  EXPECT_EQ(FileRuleWords({-1, "/a b", 0}), "-r /a b  # world -1");
}

TEST(OperationWordsTest, LabelTypesAndWordListsHaveNames) {
  EXPECT_EQ(LabelTypeWord(LabelType::kDomain), "domain");
  EXPECT_EQ(LabelTypeWord(LabelType::kObject), "object");
  const std::vector<std::string> names = {"object", "capability", "capability-param", "access",
                                          "event",  "file-type",  "socket-type",      "syscall"};
  for (std::size_t i = 0; i < names.size(); ++i) {
    EXPECT_EQ(WordListWord(static_cast<WordList>(i + 1)), names[i]);
  }
}

TEST(OperationWordsTest, ListThatDoesNotExistIsANumber) {
  EXPECT_EQ(WordListWord(static_cast<WordList>(9)), "list-9");
  EXPECT_EQ(WordListWord(static_cast<WordList>(4711)), "list-4711");
}

TEST(OperationWordsTest, WordsAreJoinedByBlanks) {
  EXPECT_EQ(Join({}), "");
  EXPECT_EQ(Join({"a"}), "a");
  EXPECT_EQ(Join({"a", "b", "c"}), "a b c");
}

TEST_F(TraceTest, DomainIsItsNameOrItsNumber) {
  const DomainId id = Make("netDom");
  EXPECT_EQ(DomainWord(module_, id), "netDom");
  EXPECT_EQ(DomainWord(module_, 0), "rootDom");
  EXPECT_EQ(DomainWord(module_, 77), "#77");
}

}  // namespace
}  // namespace StandIn
