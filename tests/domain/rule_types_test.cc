// The description of the rule types, beside the words of policy files.
#include "platform/rule_types.h"

#include <gtest/gtest.h>

namespace {

using namespace ZekCtl::Security;

// "-a object:1 access:4 decision": a word with the number of its list, "domain" for a domain's
// name and nothing for a free word.
std::string FormOf(const RuleTypeInfo& info) {
  std::string form = info.keyword;
  for (const RuleWordInfo& word : info.Words()) {
    form += std::string(" ") + word.name;
    if (word.list) form += ":" + std::to_string(*word.list);
    if (word.isDomain) form += ":domain";
  }
  return form + (info.HasDecision() ? " decision" : " permission");
}

TEST(RuleTypesTest, EachHasItsWordsAndTheirLists) {
  std::string forms;
  for (const RuleTypeInfo& info : kRuleTypes) forms += FormOf(info) + "\n";
  EXPECT_EQ(forms,
            "-a object:1 access:4 decision\n"
            "-c capability:2 decision\n"
            "-d label:1 target domain:domain event:5 decision\n"
            "-f parent label:1 file label:1 file type:6 decision\n"
            "-p capability:3 parameter decision\n"
            "-r path permission\n"
            "-s system call:8 decision\n"
            "-u label:1 socket type:7 decision\n");
}

TEST(RuleTypesTest, KeywordsLeadToTheirTypes) {
  EXPECT_EQ(TypeOfKeyword("-s"), RuleType::kSyscall);
  EXPECT_EQ(TypeOfKeyword("-r"), RuleType::kPath);
  for (const RuleTypeInfo& info : kRuleTypes) EXPECT_EQ(TypeOfKeyword(info.keyword), info.type);
  for (const char* other : {"", "-", "s", "-S", "-ss", "-x"}) {
    EXPECT_EQ(TypeOfKeyword(other), std::nullopt) << other;
  }
}

TEST(RuleTypesTest, OnlyTransitionsNameADomain) {
  for (const RuleTypeInfo& info : kRuleTypes) {
    const bool isTransition = info.type == RuleType::kTransition;
    EXPECT_EQ(info.DomainWord(), isTransition ? std::optional<std::size_t>(1) : std::nullopt)
        << info.keyword;
  }
}

// The words stand in the records in the order of the line.
TEST(RuleTypesTest, RowsLeadToTheFieldsOfTheirRecords) {
  const ZekAccess_FileCreationRule file{1, 2, "d", "parent", "file", "fifo", true};
  const ZekAccess_DomTransRule transition{1, 2, "d", "label", "target", 7, "exec", true};
  const ZekAccess_FilePathAccessRule path{1, 2, "d", "/etc", "rw"};
  const auto textOf = []<typename Record>(const Record& record) {
    std::string text;
    for (const auto& word : kRuleRow<Record>.Words()) {
      text += record.*word.field + " ";
      if (word.domainId != nullptr) text += std::to_string(record.*word.domainId) + " ";
    }
    return text;
  };
  EXPECT_EQ(textOf(file), "parent file fifo ");
  EXPECT_EQ(textOf(transition), "label target 7 exec ");
  EXPECT_EQ(textOf(path), "/etc ");
}

TEST(RuleTypesTest, QuestionsUseEachPositionOnce) {
  for (const RuleTypeInfo& info : kRuleTypes) {
    if (!info.HasDecision()) continue;
    // Position 0 is the operation unless a word of the rule is.
    unsigned int used = info.operation == nullptr ? 0 : 1;
    for (const RuleWordInfo& word : info.Words()) {
      EXPECT_NE(word.questionWord, nullptr) << info.keyword;
      used += 1U << word.questionPosition;
    }
    const std::size_t count = info.wordCount + (info.operation == nullptr ? 0 : 1);
    EXPECT_EQ(used, (1U << count) - 1) << info.keyword;
  }
}

// As a program evaluates it, too, and not the compiler alone.
TEST(RuleTypesTest, OrderIsThatOfTheEnumeratorsAndOfTheKeywords) {
  auto types = ZekCtl::Security::RuleInfos();
  EXPECT_TRUE(ZekCtl::Security::AreInOrder(types));
  std::swap(types.front().keyword, types.back().keyword);
  EXPECT_FALSE(ZekCtl::Security::AreInOrder(types));
  types = ZekCtl::Security::RuleInfos();
  std::swap(types.front().type, types.back().type);
  EXPECT_FALSE(ZekCtl::Security::AreInOrder(types));
}

}  // namespace
