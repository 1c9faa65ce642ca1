// The rule type "-d": its target is looked up while the line is read.
#include "domain/keyword_rules.h"
#include "tests/domain/domain_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class TransitionRulesTest : public DomainTest {
 protected:
  // Adds the line as number 7 of appDom (id 1), beside which guestDom (id 2) exists.
  Outcome Add(const std::string& line) {
    return RunWithInterface([&](SecPolicy::ZekAccessInterfaceImpl& iface) {
      const unsigned int domain = DomainCalled("appDom");
      DomainCalled("guestDom");
      SecPolicy::DomTransRules rules;
      rules.AddRule(7, "appDom", domain, WordsOf(line), iface);
      rules.Set(iface);
    });
  }

  static std::string ParseError(const std::string& cause) {
    return "Error in parsing policy for domain: appDom: 7 : " + cause;
  }
};

TEST_F(TransitionRulesTest, TheTargetIsLookedUpThenLabelAndEventAreValidated) {
  const Outcome outcome = Add("default guestDom exec grant");
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Operations(),
              ElementsAre("find-domain guestDom", "validate-word object default",
                          "validate-word event exec",
                          "set-rule appDom -d default guestDom exec grant # line 7 into 2"));
}

TEST_F(TransitionRulesTest, ADomainMayBeItsOwnTarget) {
  EXPECT_THAT(Add("tardisk appDom fork revoke").Operations({"set-rule"}),
              ElementsAre("set-rule appDom -d tardisk appDom fork revoke # line 7 into 1"));
}

TEST_F(TransitionRulesTest, AWrongNumberOfWordsIsRefusedBeforeTheLookup) {
  for (const std::string line :
       {"", "default guestDom grant", "default guestDom exec grant grant"}) {
    const Outcome outcome = Add(line);
    EXPECT_EQ(outcome.error, ParseError("incorrect number of arguments for this rule type"));
    EXPECT_THAT(outcome.Operations(), IsEmpty()) << line;
  }
}

TEST_F(TransitionRulesTest, AnUnknownTargetIsReportedWhateverElseIsWrong) {
  for (const std::string line : {"default noDom exec grant", "nonsense noDom jump perhaps"}) {
    const Outcome outcome = Add(line);
    EXPECT_EQ(outcome.error, ParseError("Failed to fetch domain id for: noDom"));
    EXPECT_THAT(outcome.Operations(), ElementsAre("find-domain noDom")) << line;
  }
}

TEST_F(TransitionRulesTest, AFailingLookupIsReportedInTheLibrarysWords) {
  Fail(Operation::kFindDomain);
  EXPECT_EQ(Add("default guestDom exec grant").error,
            ParseError("refused on request: find-domain, call 1"));
}

TEST_F(TransitionRulesTest, WhatIsReportedAfterTheLookup) {
  struct Row {
    std::string line;
    std::string cause;
  };
  const Row rows[] = {
      {"nonsense guestDom jump Grant", "invalid keyword Grant"},
      {"nonsense guestDom jump grant", "unknown object label \"nonsense\""},
      {"default guestDom exce grant", "unknown transition event \"exce\" (nearest: exec)"},
  };
  for (const Row& row : rows) {
    const Outcome outcome = Add(row.line);
    EXPECT_EQ(outcome.error, ParseError(row.cause));
    EXPECT_THAT(outcome.Operations({"set-rule"}), IsEmpty()) << row.line;
  }
}

TEST_F(TransitionRulesTest, ATargetWhoseFileComesLaterExistsAlready) {
  Domain("appDom", "-d default zebraDom exec grant\n");
  Domain("zebraDom", "");
  EXPECT_EQ(LoadDomains().error, "");
  EXPECT_THAT(RulesOf("appDom"), ElementsAre("-d default zebraDom exec grant"));
}

TEST_F(TransitionRulesTest, ATargetThatOnlyTheKernelHasWillDo) {
  Domain("appDom", "-d default rootDom exec grant\n");
  EXPECT_THAT(LoadDomains().Operations({"set-rule"}),
              ElementsAre("set-rule appDom -d default rootDom exec grant # line 1 into 0"));
}

TEST_F(TransitionRulesTest, ARefusedTransitionIsASetErrorAndEndsTheSet) {
  Domain("appDom",
         "-d default appDom exec grant\n-d default rootDom exec grant\n"
         "-d tardisk appDom exec grant\n");
  Fail(Operation::kSetRule, 2);
  EXPECT_THAT(LoadDomains().Errors(),
              ElementsAre("Error in setting policy for domain: appDom: 2 : refused on request: "
                          "set-rule, call 2",
                          "Error in setting the policy for some domains"));
  EXPECT_THAT(RulesOf("appDom"), ElementsAre("-d default appDom exec grant"));
}

}  // namespace
}  // namespace SecPolicyTest
