// The family of rule types that consist of words and end in a decision.
#include "tests/domain/domain_fixture.h"
#include "tests/domain/rule_family.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::ElementsAreArray;
using testing::IsEmpty;

class KeywordRulesTest : public DomainTest {
 protected:
  // Adds the lines, numbered from 11, to a rule set of appDom, then sets it. The value is what
  // each line and the setting failed with.
  Outcome AddAndSet(const RuleTypeRow& type, const std::vector<std::string>& lines) {
    return RunWithInterface([&](SecPolicy::ZekAccessInterfaceImpl& iface) {
      const unsigned int domain = DomainCalled("appDom");
      const auto rules = type.make();
      std::string failures;
      const auto keep = [&](const auto& action) {
        try {
          action();
        } catch (const Tavon::Lib::TavonException& failure) {
          failures += std::string(failure.what()) + "\n";
        }
      };
      unsigned int number = 11;
      for (const std::string& line : lines) {
        keep([&] { rules->AddRule(number++, "appDom", domain, WordsOf(line), iface); });
      }
      keep([&] { rules->Set(iface); });
      return failures;
    });
  }

  static std::string ParseError(const std::string& cause) {
    return "Error in parsing policy for domain: appDom: 11 : " + cause + "\n";
  }
};

TEST_F(KeywordRulesTest, WordsAreValidatedInTheirOrderAndSetAsTheyStand) {
  for (const RuleTypeRow& type : KeywordRuleTypes()) {
    std::vector<std::string> expected;
    for (const RuleWordRow& word : type.words) {
      if (!word.list.empty()) expected.push_back("validate-word " + word.list + " " + word.word);
    }
    const std::string rule = type.keyword + " " + WordsOfType(type);
    expected.push_back("set-rule appDom " + rule + " grant # line 11");
    const Outcome outcome = AddAndSet(type, {WordsOfType(type) + " grant"});
    EXPECT_EQ(outcome.value, "") << type.keyword;
    EXPECT_THAT(outcome.Operations(), ElementsAreArray(expected)) << type.keyword;
  }
}

TEST_F(KeywordRulesTest, RevokedRulesAreSetAsRevoked) {
  for (const RuleTypeRow& type : KeywordRuleTypes()) {
    const Outcome outcome = AddAndSet(type, {WordsOfType(type) + " revoke"});
    EXPECT_THAT(outcome.Operations({"set-rule"}),
                ElementsAre("set-rule appDom " + type.keyword + " " + WordsOfType(type) +
                            " revoke # line 11"));
  }
}

TEST_F(KeywordRulesTest, AWrongNumberOfWordsIsRefusedBeforeAnyIsLookedAt) {
  for (const RuleTypeRow& type : KeywordRuleTypes()) {
    const std::string words = WordsOfType(type);
    const std::string tooFew = words.substr(0, words.rfind(' ') + 1) + "grant";
    for (const std::string& line : {std::string(), tooFew, words + " grant grant"}) {
      const Outcome outcome = AddAndSet(type, {line});
      EXPECT_EQ(outcome.value, ParseError("incorrect number of arguments for this rule type"))
          << type.keyword << " " << line;
      EXPECT_THAT(outcome.Operations(), IsEmpty()) << type.keyword << " " << line;
    }
  }
}

TEST_F(KeywordRulesTest, ABadDecisionIsReportedBeforeABadWord) {
  for (const RuleTypeRow& type : KeywordRuleTypes()) {
    for (const std::string word : {"Grant", "allow", "GRANT", "revoked"}) {
      const Outcome outcome = AddAndSet(type, {WordsOfType(type, 0, "nonsense") + " " + word});
      EXPECT_EQ(outcome.value, ParseError("invalid keyword " + word)) << type.keyword;
      EXPECT_THAT(outcome.Operations(), IsEmpty()) << type.keyword;
    }
  }
}

TEST_F(KeywordRulesTest, ABadWordIsReportedInTheLibrarysWordsAndEndsTheLine) {
  for (const RuleTypeRow& type : KeywordRuleTypes()) {
    std::vector<std::string> expected;
    for (std::size_t i = 0; i < type.words.size(); ++i) {
      const RuleWordRow& word = type.words[i];
      if (word.list.empty()) continue;
      FailNothing();
      Fail(Operation::kValidateWord, expected.size() + 1);
      const std::string refusal =
          "refused on request: validate-word, call " + std::to_string(expected.size() + 1);
      const Outcome outcome = AddAndSet(type, {WordsOfType(type, i, "wrong") + " grant"});
      EXPECT_EQ(outcome.value, ParseError(refusal)) << type.keyword << " word " << i;
      std::vector<std::string> operations = expected;
      operations.push_back("validate-word " + word.list + " wrong ! " + refusal);
      EXPECT_THAT(outcome.Operations(), ElementsAreArray(operations)) << type.keyword;
      expected.push_back("validate-word " + word.list + " " + word.word);
    }
  }
}

TEST_F(KeywordRulesTest, AWordThatItsListLacksIsNamed) {
  const RuleTypeRow& capabilities = KeywordRuleTypes()[1];
  const Outcome outcome = AddAndSet(capabilities, {"net_amdin grant"});
  EXPECT_EQ(outcome.value, ParseError("unknown capability \"net_amdin\" (nearest: net_admin)"));
  EXPECT_THAT(outcome.Operations({"set-rule"}), IsEmpty());
}

TEST_F(KeywordRulesTest, AFailedLineLeavesTheRulesBeforeAndBehindIt) {
  for (const RuleTypeRow& type : KeywordRuleTypes()) {
    const std::string words = WordsOfType(type);
    const Outcome outcome = AddAndSet(
        type, {words + " grant", words + " maybe", words + " more grant", words + " revoke"});
    const std::string rule = "set-rule appDom " + type.keyword + " " + words;
    EXPECT_THAT(outcome.Operations({"set-rule"}),
                ElementsAre(rule + " grant # line 11", rule + " revoke # line 14"));
  }
}

TEST_F(KeywordRulesTest, GrantAndLaterRevocationAreTwoRulesInTheirOrder) {
  Domain("appDom", "-s openat grant\n\n-s close grant\n-s openat revoke\n");
  EXPECT_THAT(LoadDomains().Operations({"set-rule"}),
              ElementsAre("set-rule appDom -s openat grant # line 1",
                          "set-rule appDom -s close grant # line 3",
                          "set-rule appDom -s openat revoke # line 4"));
  EXPECT_THAT(RulesOf("appDom"), ElementsAre("-s openat revoke", "-s close grant"));
}

TEST_F(KeywordRulesTest, ARefusedRuleEndsTheSetAndKeepsThoseBefore) {
  Fail(Operation::kSetRule, 2);
  for (const RuleTypeRow& type : KeywordRuleTypes()) {
    const std::string words = WordsOfType(type);
    const Outcome outcome =
        AddAndSet(type, {words + " grant", words + " revoke", words + " grant"});
    const std::string refusal = "refused on request: set-rule, call 2";
    EXPECT_EQ(outcome.value, "Error in setting policy for domain: appDom: 12 : " + refusal + "\n");
    const std::string rule = "set-rule appDom " + type.keyword + " " + words;
    EXPECT_THAT(outcome.Operations({"set-rule"}),
                ElementsAre(rule + " grant # line 11", rule + " revoke # line 12 ! " + refusal));
  }
}

TEST_F(KeywordRulesTest, ParametersMayBeAnyWord) {
  Domain("appDom", "-p net_bind_service \"8*0 grant\n-p net_bind_service grant grant\n");
  EXPECT_EQ(LoadDomains().error, "");
  EXPECT_THAT(RulesOf("appDom"),
              ElementsAre("-p net_bind_service \"8*0 grant", "-p net_bind_service grant grant"));
}

}  // namespace
}  // namespace SecPolicyTest
