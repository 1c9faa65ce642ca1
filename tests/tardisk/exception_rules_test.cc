// The rule type "-E": parsing one line, and installing what was kept.
#include "tardisk/tardisk_exception_rules.h"
#include "tests/tardisk/tardisk_fixture.h"

namespace SecPolicyTest {
namespace {

using SecPolicy::TardiskExceptionRules;
using testing::ElementsAre;
using testing::IsEmpty;

std::queue<std::string> Words(const std::string& line) { return SecPolicy::StringToQueue(line); }

class ExceptionRulesTest : public TardiskTest {
 protected:
  // A tardisk to label, and "web" and "mail" to label it with.
  void Prepare() {
    PlainTardisks({"vendor"});
    LoadWellKnown({"web", "mail"});
  }

  // Adds `lines` as line 4 and on of /p/file, and installs what was kept. The value is the failures
  // of the lines, each on a line.
  Outcome AddAndSet(const std::vector<std::string>& lines) {
    return RunWithInterface([&](auto& iface) {
      TardiskExceptionRules rules;
      std::string failures;
      unsigned int number = 4;
      for (const std::string& line : lines) {
        try {
          rules.AddRule(number++, "/tardisks/vendor", "/p/file", Words(line), iface);
        } catch (const Tavon::Lib::TavonException& failure) {
          failures += std::string(failure.what()) + "\n";
        }
      }
      rules.Set(iface);
      return failures;
    });
  }

  [[nodiscard]] static std::string ParseError(int line, const std::string& cause) {
    return "Error in parsing policy for domain: /p/file: " + std::to_string(line) + " : " + cause;
  }
};

TEST(TardiskRulesTest, KeepTheKeywordThatTheyAreFiledUnder) {
  SecPolicy::TardiskExceptionRules rules;
  EXPECT_EQ(rules.Keyword(), "");
  rules.SetKeyword("-E");
  EXPECT_EQ(rules.Keyword(), "-E");
}

TEST_F(ExceptionRulesTest, TardiskIsLabelledThenTheTransitionIsSentTwice) {
  Prepare();
  const Outcome outcome = AddAndSet({"web appDom"});
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.value, "");
  EXPECT_THAT(outcome.Operations({"find-domain", "lookup-label", "set-file-label", "set-rule"}),
              ElementsAre("find-domain appDom",                   //
                          "lookup-label object web",              //
                          "set-file-label /tardisks/vendor web",  //
                          "set-rule rootDom -d web appDom exec grant # line 4 into 1",
                          "set-rule rootDom -d web appDom exec grant # line 4 into 1"));
  EXPECT_EQ(LabelOf("/tardisks/vendor"), "web");
  EXPECT_EQ(Transitions(0).value, "web appDom exec into 1 line 4 grant\n");
}

TEST_F(ExceptionRulesTest, LaunchDomainAndEventAreThePlatforms) {
  Describe(R"({"format": 1, "words": {"transitionEvents": ["start"]},
               "tardisks": {"launchDomain": "ioFilterDom", "execEvent": "start"}})");
  Prepare();
  const Outcome outcome = AddAndSet({"web appDom"});
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Operations({"tardisk-launch-domain"}), ElementsAre("tardisk-launch-domain"));
  // The launch domain's id is not looked up: the rule goes to the domain 0.
  EXPECT_THAT(outcome.Operations({"find-domain"}), ElementsAre("find-domain appDom"));
  EXPECT_THAT(outcome.Operations({"set-rule"}),
              ElementsAre("set-rule rootDom -d web appDom start grant # line 4 into 1",
                          "set-rule rootDom -d web appDom start grant # line 4 into 1"));
}

TEST_F(ExceptionRulesTest, LineMustHoldTwoWords) {
  Prepare();
  for (const std::string line : {"", "web", "web appDom more", "web appDom grant more"}) {
    const Outcome outcome = AddAndSet({line});
    EXPECT_EQ(outcome.value, ParseError(4, "incorrect number of arguments for this rule type\n"))
        << line;
    EXPECT_THAT(outcome.events, IsEmpty()) << line;
  }
}

TEST_F(ExceptionRulesTest, SecondRuleIsRefusedBeforeItsWordsAreCounted) {
  Prepare();
  const Outcome outcome = AddAndSet({"web appDom", "mail ioFilterDom", "one two three"});
  EXPECT_EQ(outcome.value, ParseError(5, "Only one rule of this type is allowed\n") +
                               ParseError(6, "Only one rule of this type is allowed\n"));
  EXPECT_THAT(outcome.Operations({"set-file-label"}),
              ElementsAre("set-file-label /tardisks/vendor web"));
}

TEST_F(ExceptionRulesTest, RefusedLineLeavesRoomForARule) {
  Prepare();
  const Outcome outcome = AddAndSet({"web", "web noDom", "mail appDom"});
  EXPECT_EQ(outcome.value, ParseError(4, "incorrect number of arguments for this rule type\n") +
                               ParseError(5, "Failed to fetch domain id for noDom\n"));
  EXPECT_EQ(Transitions(0).value, "mail appDom exec into 1 line 6 grant\n");
}

TEST_F(ExceptionRulesTest, UnknownTargetDomainIsNamed) {
  Prepare();
  const Outcome outcome = AddAndSet({"web AppDom"});
  EXPECT_EQ(outcome.value, ParseError(4, "Failed to fetch domain id for AppDom\n"));
  EXPECT_THAT(outcome.events, ElementsAre("kernel: find-domain AppDom"));
}

TEST_F(ExceptionRulesTest, RefusedLookUpOfTheTargetIsAParseErrorToo) {
  Prepare();
  Fail(Operation::kFindDomain);
  EXPECT_EQ(AddAndSet({"web appDom"}).value,
            ParseError(4, "refused on request: find-domain, call 1\n"));
}

TEST_F(ExceptionRulesTest, LabelIsJudgedOnlyWhenItIsSet) {
  Prepare();
  const Outcome outcome = AddAndSet({"shelf appDom"});
  EXPECT_EQ(outcome.value, "");
  EXPECT_EQ(outcome.error,
            "/p/file:4 : Tardisk: /tardisks/vendor : no object label is named \"shelf\"");
  EXPECT_THAT(outcome.Operations({"validate-word", "set-rule"}), IsEmpty());
}

TEST_F(ExceptionRulesTest, RefusedLabelIsNamedAfterItsRuleAndNoTransitionIsSent) {
  Prepare();
  Fail(Operation::kSetFileLabel, 1, EACCES);
  const Outcome outcome = AddAndSet({"web appDom"});
  EXPECT_EQ(outcome.error,
            "/p/file:4 : Tardisk: /tardisks/vendor : Unable to set file label (web) for file "
            "/tardisks/vendor: Permission denied");
  EXPECT_THAT(outcome.Operations({"set-rule"}), IsEmpty());
}

TEST_F(ExceptionRulesTest, RefusedTransitionIsNamedAfterItsRuleAndTheLabelStays) {
  Prepare();
  for (const std::uint64_t call : {1U, 2U}) {
    FailNothing();
    Fail(Operation::kSetRule, call);
    const Outcome outcome = AddAndSet({"web appDom"});
    EXPECT_EQ(outcome.error,
              "/p/file:4 : Tardisk: /tardisks/vendor : refused on request: set-rule, call " +
                  std::to_string(call));
    EXPECT_THAT(outcome.Operations({"set-rule"}), testing::SizeIs(call));
    EXPECT_EQ(Transitions(0).value, call == 1 ? "" : "web appDom exec into 1 line 4 grant\n");
  }
  EXPECT_EQ(LabelOf("/tardisks/vendor"), "web");
}

TEST_F(ExceptionRulesTest, RefusedQuestionsAreNamedAfterTheRule) {
  Prepare();
  for (const Operation operation :
       {Operation::kTardiskLaunchDomain, Operation::kTardiskExecEvent}) {
    FailNothing();
    Fail(operation);
    EXPECT_EQ(AddAndSet({"web appDom"}).error,
              "/p/file:4 : Tardisk: /tardisks/vendor : refused on request: " +
                  std::string(StandIn::InfoOf(operation).name) + ", call 1");
  }
}

TEST_F(ExceptionRulesTest, NothingToSetAsksNothing) {
  const Outcome outcome = AddAndSet({});
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(ExceptionRulesTest, OutOfMemoryPassesThroughUnnamed) {
  Prepare();
  for (const Operation operation :
       {Operation::kFindDomain, Operation::kLookupLabel, Operation::kSetRule}) {
    FailNothing();
    Fail(Fault{.operation = operation, .kind = Fault::Kind::kOutOfMemory});
    EXPECT_EQ(AddAndSet({"web appDom"}).error, "other: std::bad_alloc");
  }
}

}  // namespace
}  // namespace SecPolicyTest
