#include "tests/host/module/module_fixture.h"

namespace StandIn {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

// ---- Words ----

TEST_F(ModuleTest, WordsOfAListAreNumberedInItsOrder) {
  EXPECT_THAT(module_.Words(WordList::kSyscalls),
              ElementsAre(Pair("close", 3), Pair("open", 2), Pair("read", 1)));
}

TEST_F(ModuleTest, AcceptedWordsPass) {
  module_.AddLabels({"logs"}, kObject);
  EXPECT_EQ(RefusalOf([&] { module_.ValidateWord(WordList::kObjects, "logs"); }), "(done)");
  EXPECT_EQ(RefusalOf([&] { module_.ValidateWord(WordList::kSyscalls, "open"); }), "(done)");
}

TEST_F(ModuleTest, ARejectedWordIsNamedWithItsListAndTheNearestWord) {
  struct Row {
    WordList list;
    std::string word;
    const char* text;
  };
  const Row rows[] = {
      {WordList::kObjects, "defualt", "unknown object label \"defualt\" (nearest: default)"},
      {WordList::kCapabilities, "net_amdin",
       "unknown capability \"net_amdin\" (nearest: net_admin)"},
      {WordList::kParamCapabilities, "net_admin",
       "unknown capability with parameter \"net_admin\""},
      {WordList::kObjectAccesses, "raed", "unknown object access \"raed\" (nearest: read)"},
      {WordList::kTransitionEvents, "fork", "unknown transition event \"fork\""},
      {WordList::kFileTypes, "File", "unknown file type \"File\" (nearest: file)"},
      {WordList::kSocketTypes, "streams", "unknown socket type \"streams\" (nearest: stream)"},
      {WordList::kSyscalls, "opne", "unknown system call \"opne\" (nearest: open)"},
      {WordList::kSyscalls, "", "unknown system call \"\""},
      {WordList::kSyscalls, std::string("open\0", 5),
       "unknown system call \"open\\0\" (nearest: open)"},
  };
  for (const Row& row : rows) {
    EXPECT_EQ(RefusalOf([&] { module_.ValidateWord(row.list, row.word); }),
              std::string("EINVAL: ") + row.text);
  }
}

TEST_F(ModuleTest, ARemovedLabelIsNoWordAnyMore) {
  module_.AddLabels({"logs"}, kObject);
  module_.RemoveLabels({"logs"}, kObject);
  EXPECT_EQ(RefusalOf([&] { module_.ValidateWord(WordList::kObjects, "logs"); }),
            "EINVAL: unknown object label \"logs\"");
}

TEST_F(ModuleTest, AnUnknownWordListIsRefused) {
  for (const unsigned number : {0U, 9U}) {
    const auto list = static_cast<WordList>(number);
    const std::string refusal = "EINVAL: no word list has the number " + std::to_string(number);
    EXPECT_EQ(RefusalOf([&] { module_.ValidateWord(list, "a"); }), refusal);
    EXPECT_EQ(RefusalOf([&] { module_.Words(list); }), refusal);
  }
}

TEST(SimulatedModule, AListThatTheDescriptionLacksIsEmpty) {
  const FakeProcessTable processes;
  SimulatedModule module(ModuleDescription(), processes);
  EXPECT_THAT(module.Words(WordList::kSyscalls), IsEmpty());
  EXPECT_EQ(RefusalOf([&] { module.ValidateWord(WordList::kSyscalls, "open"); }),
            "EINVAL: unknown system call \"open\"");
}

// ---- Rules ----

TEST_F(ModuleTest, EveryKindOfRuleComesBackAsItWasSet) {
  const DomainId app = Make("appDom");
  struct Row {
    RuleType type;
    std::vector<std::string> words;
  };
  const Row rows[] = {
      {RuleType::kObjectAccess, {"default", "read"}},
      {RuleType::kCapability, {"sys_boot"}},
      {RuleType::kTransition, {"tardisk", "appDom", "exec"}},
      {RuleType::kFileCreation, {"default", "tardisk", "dir"}},
      {RuleType::kCapabilityParam, {"net_bind", "any thing: 80 \xff"}},
      {RuleType::kSyscall, {"open"}},
      {RuleType::kUnixSocket, {"default", "stream"}},
  };
  for (const Row& row : rows) {
    module_.SetRule(row.type, 0, {7, row.words, app, Decision::kGrant});
    const std::vector<Rule> rules = module_.Rules(row.type, 0);
    ASSERT_EQ(rules.size(), 1U) << row.words[0];
    EXPECT_EQ(rules[0].line, 7U);
    EXPECT_EQ(rules[0].words, row.words);
    EXPECT_EQ(rules[0].decision, Decision::kGrant);
    EXPECT_THAT(module_.Rules(row.type, app), IsEmpty()) << "another domain";
  }
  EXPECT_EQ(module_.Rules(RuleType::kTransition, 0)[0].targetDomain, app);
}

TEST_F(ModuleTest, TheLaterOfTwoDecisionsWinsInThePlaceOfTheFirst) {
  Set(RuleType::kSyscall, 0, {"open"}, Decision::kGrant, 1);
  Set(RuleType::kSyscall, 0, {"read"}, Decision::kGrant, 2);
  Set(RuleType::kSyscall, 0, {"open"}, Decision::kRevoke, 3);
  const std::vector<Rule> rules = module_.Rules(RuleType::kSyscall, 0);
  EXPECT_THAT(WordsOf(RuleType::kSyscall, 0), ElementsAre("open", "read"));
  EXPECT_EQ(rules[0].decision, Decision::kRevoke);
  EXPECT_EQ(rules[0].line, 3U);
  EXPECT_EQ(rules[1].decision, Decision::kGrant);
}

TEST_F(ModuleTest, EveryWordBelongsToTheKey) {
  Set(RuleType::kFileCreation, 0, {"default", "tardisk", "file"});
  Set(RuleType::kFileCreation, 0, {"default", "tardisk", "dir"});
  Set(RuleType::kFileCreation, 0, {"tardisk", "default", "file"});
  EXPECT_THAT(WordsOf(RuleType::kFileCreation, 0),
              ElementsAre("default tardisk file", "default tardisk dir", "tardisk default file"));
}

TEST_F(ModuleTest, ARuleWithARejectedWordIsRefused) {
  struct Row {
    RuleType type;
    std::vector<std::string> words;
    const char* refusal;
  };
  const Row rows[] = {
      {RuleType::kObjectAccess, {"x", "read"}, "unknown object label \"x\""},
      {RuleType::kObjectAccess, {"default", "x"}, "unknown object access \"x\""},
      {RuleType::kCapability, {"net_bind"}, "unknown capability \"net_bind\""},
      {RuleType::kTransition, {"x", "rootDom", "exec"}, "unknown object label \"x\""},
      {RuleType::kTransition, {"default", "rootDom", "x"}, "unknown transition event \"x\""},
      {RuleType::kTransition, {"default", "", "exec"}, "the target domain \"\" is empty"},
      {RuleType::kFileCreation, {"x", "default", "dir"}, "unknown object label \"x\""},
      {RuleType::kFileCreation, {"default", "x", "dir"}, "unknown object label \"x\""},
      {RuleType::kFileCreation, {"default", "default", "x"}, "unknown file type \"x\""},
      {RuleType::kCapabilityParam,
       {"sys_boot", "1"},
       "unknown capability with parameter \"sys_boot\""},
      {RuleType::kCapabilityParam, {"net_bind", ""}, "the parameter \"\" is empty"},
      {RuleType::kSyscall, {"x"}, "unknown system call \"x\""},
      {RuleType::kUnixSocket, {"x", "stream"}, "unknown object label \"x\""},
      {RuleType::kUnixSocket, {"default", "x"}, "unknown socket type \"x\""},
  };
  for (const Row& row : rows) {
    EXPECT_EQ(RefusalOf([&] { Set(row.type, 0, row.words); }),
              std::string("EINVAL: ") + row.refusal);
    EXPECT_THAT(module_.Rules(row.type, 0), IsEmpty()) << row.refusal;
  }
}

TEST_F(ModuleTest, ARuleWithAWrongNumberOfWordsIsRefused) {
  EXPECT_EQ(RefusalOf([&] {
              Set(RuleType::kSyscall, 0, {"open", "read"});
            }),
            "EINVAL: a rule \"-s\" has 1 word, not 2");
  EXPECT_EQ(RefusalOf([&] {
              Set(RuleType::kFileCreation, 0, {"default", "default"});
            }),
            "EINVAL: a rule \"-f\" has 3 words, not 2");
}

TEST(FewWords, HoldsThreeAndNoMore) {
  FewWords words{"a", "b"};
  words.push_back("c");
  EXPECT_EQ(words, (FewWords{"a", "b", "c"}));
  EXPECT_THROW(words.push_back("d"), std::length_error);
  EXPECT_THAT(std::vector<std::string>(words.begin(), words.end()), ElementsAre("a", "b", "c"));
  EXPECT_FALSE((words == FewWords{"a", "b"}));
}

TEST_F(ModuleTest, AParameterWithANulIsRefused) {
  const std::string parameter("8\0", 2);
  EXPECT_EQ(RefusalOf([&] {
              Set(RuleType::kCapabilityParam, 0, {"net_bind", parameter});
            }),
            "EINVAL: the parameter \"8\\0\" holds a NUL byte");
}

TEST_F(ModuleTest, RulesNeedADomainAndAKind) {
  EXPECT_EQ(RefusalOf([&] { Set(RuleType::kSyscall, 3, {"x"}); }),
            "ENOENT: no domain has the id 3");
  EXPECT_EQ(RefusalOf([&] { module_.Rules(RuleType::kSyscall, 3); }),
            "ENOENT: no domain has the id 3");
  const auto type = static_cast<RuleType>(8);
  EXPECT_EQ(RefusalOf([&] { Set(type, 0, {"x"}); }), "EINVAL: no kind of rules has the number 8");
  EXPECT_EQ(RefusalOf([&] { module_.Rules(type, 0); }),
            "EINVAL: no kind of rules has the number 8");
}

TEST_F(ModuleTest, PathRulesAreNotSetAsDecisions) {
  EXPECT_EQ(RefusalOf([&] { Set(RuleType::kPath, 0, {"/etc"}); }),
            "EINVAL: a rule \"-r\" has no decision");
  EXPECT_EQ(RefusalOf([&] { module_.Rules(RuleType::kPath, 0); }),
            "EINVAL: a rule \"-r\" has no decision");
}

TEST_F(ModuleTest, ATransitionNeedsATargetThatExists) {
  EXPECT_EQ(RefusalOf([&] {
              module_.SetRule(RuleType::kTransition, 0,
                              {1, {"default", "appDom", "exec"}, 3, Decision::kGrant});
            }),
            "ENOENT: no domain has the id 3");
  EXPECT_THAT(module_.Rules(RuleType::kTransition, 0), IsEmpty());
}

TEST_F(ModuleTest, TransitionsIntoADestroyedDomainVanish) {
  const DomainId a = Make("a");
  Make("b");
  SetTransition(0, "default", "a");
  SetTransition(0, "default", "b");
  SetTransition(0, "tardisk", "a");
  module_.DestroyDomain(a);
  EXPECT_THAT(WordsOf(RuleType::kTransition, 0), ElementsAre("default b exec"));
  EXPECT_EQ(Make("a2"), a);
  SetTransition(0, "default", "a2");
  EXPECT_EQ(module_.GetDomainInfo(a)->refCount, 1U);
}

TEST_F(ModuleTest, ARemovedLabelStaysInTheRulesThatNameIt) {
  module_.AddLabels({"logs"}, kObject);
  Set(RuleType::kObjectAccess, 0, {"logs", "read"});
  module_.RemoveLabels({"logs"}, kObject);
  EXPECT_THAT(WordsOf(RuleType::kObjectAccess, 0), ElementsAre("logs read"));
}

// ---- Capability parameters ----

Rule Param(std::uint32_t line, const char* capability, const char* parameter, Decision decision) {
  return {line, {capability, parameter}, 0, decision};
}

TEST_F(ModuleTest, AParameterGrantedAndRevokedIsAContradiction) {
  EXPECT_EQ(RefusalOf([&] {
              module_.CheckCapabilityParams("appDom",
                                            {Param(3, "net_bind", "80", Decision::kGrant),
                                             Param(5, "net_bind", "81", Decision::kGrant),
                                             Param(9, "net_bind", "80", Decision::kRevoke)});
            }),
            "EINVAL: the capability \"net_bind\" with the parameter \"80\" of the domain \"appDom\""
            " is granted on line 3 and revoked on line 9");
}

TEST_F(ModuleTest, AContradictionIsToldInTheOrderOfItsLines) {
  EXPECT_EQ(RefusalOf([&] {
              module_.CheckCapabilityParams("appDom",
                                            {Param(1, "net_bind", "80", Decision::kRevoke),
                                             Param(2, "net_bind", "80", Decision::kGrant)});
            }),
            "EINVAL: the capability \"net_bind\" with the parameter \"80\" of the domain \"appDom\""
            " is revoked on line 1 and granted on line 2");
}

TEST_F(ModuleTest, TheSameDecisionTwiceAndDifferentParametersAreNoContradiction) {
  EXPECT_EQ(RefusalOf([&] {
              module_.CheckCapabilityParams("appDom",
                                            {Param(1, "net_bind", "80", Decision::kGrant),
                                             Param(2, "net_bind", "80", Decision::kGrant),
                                             Param(3, "net_bind", "81", Decision::kRevoke),
                                             Param(4, "net_raw", "80", Decision::kRevoke)});
              module_.CheckCapabilityParams("appDom", {});
            }),
            "(done)");
}

TEST_F(ModuleTest, WhatTheModuleHoldsDoesNotContradictAList) {
  Set(RuleType::kCapabilityParam, 0, {"net_bind", "80"}, Decision::kRevoke);
  EXPECT_EQ(RefusalOf([&] {
              module_.CheckCapabilityParams("rootDom",
                                            {Param(1, "net_bind", "80", Decision::kGrant)});
            }),
            "(done)");
}

}  // namespace
}  // namespace StandIn
