// Tardisk policy files: one by one, and all that were found.
#include "tardisk/tardisk_policy.h"

#include "tests/tardisk/tardisk_fixture.h"

namespace SecPolicyTest {
namespace {

using SecPolicy::TardiskPolicy;
using testing::ElementsAre;
using testing::IsEmpty;

class TardiskPolicyTest : public TardiskTest {
 protected:
  // The policy file "exception" of the tardisk "vendor".
  void Exception(const std::string& text) {
    TardiskPolicyFile("vendor", "exception", text);
    LoadWellKnown({"web", "mail"});
  }

  // Parses "exception" and installs what it holds afterwards; the value is the parsing's failure.
  Outcome ParseAndSetOne() {
    return RunWithInterface([&](auto& iface) {
      TardiskPolicy policy(PolicyFilePath("exception"));
      std::string failure;
      try {
        policy.ParsePolicy(iface);
      } catch (const Tavon::Lib::TavonException& caught) {
        failure = caught.what();
      }
      policy.SetPolicy(iface);
      return failure;
    });
  }

  // ParseAndSetTardiskPolicy of these files.
  Outcome ParseAndSet(const std::vector<std::string>& files) {
    return RunWithInterface([&](auto& iface) {
      std::list<TardiskPolicy> owned;
      std::list<TardiskPolicy*> policies;
      for (const std::string& file : files) {
        policies.push_back(&owned.emplace_back(PolicyFilePath(file)));
      }
      SecPolicy::ParseAndSetTardiskPolicy(policies, iface);
    });
  }

  [[nodiscard]] static std::string ParseError(const std::string& file, int line,
                                              const std::string& cause) {
    return "Error in parsing policy for domain: " + PolicyFilePath(file) + ": " +
           std::to_string(line) + " : " + cause;
  }
};

TEST_F(TardiskPolicyTest, RuleIsForTheTardiskThatCarriesTheFile) {
  PlainTardisks({"base"});
  Exception("# why\n\n  -E web appDom # trailing\n");
  const Outcome outcome = ParseAndSetOne();
  EXPECT_EQ(outcome.value, "");
  EXPECT_THAT(outcome.Operations({"backing-tardisk", "set-file-label", "set-rule"}),
              ElementsAre("backing-tardisk vendor", "set-file-label /tardisks/vendor web",
                          "set-rule rootDom -d web appDom exec grant # line 3 into 1",
                          "set-rule rootDom -d web appDom exec grant # line 3 into 1"));
  EXPECT_EQ(LabelOf("/tardisks/base"), "default");
}

TEST_F(TardiskPolicyTest, CommentsAndBlankLinesMakeNoRule) {
  Exception("# nothing\n\n   \n#-E web appDom\n");
  const Outcome outcome = ParseAndSetOne();
  EXPECT_EQ(outcome.value + outcome.error, "");
  EXPECT_THAT(outcome.Operations(), ElementsAre("backing-tardisk vendor"));
}

class UnknownTypeTest : public TardiskPolicyTest,
                        public testing::WithParamInterface<const char*> {};

TEST_P(UnknownTypeTest, IsNamedInTheParseError) {
  Exception(std::string("\n") + GetParam() + " web appDom\n");
  EXPECT_EQ(ParseAndSetOne().value,
            ParseError("exception", 2,
                       std::string("invalid tardisk policy rule type (") + GetParam() + ")"));
}

INSTANTIATE_TEST_SUITE_P(EveryOtherWord, UnknownTypeTest,
                         testing::Values("-e", "E", "--E", "-EE", "-s", "-E\t"));

TEST_F(TardiskPolicyTest, TooManyWordsInstallNothing) {
  Exception("-E web appDom grant\n");
  const Outcome outcome = ParseAndSetOne();
  EXPECT_EQ(outcome.value,
            ParseError("exception", 1, "incorrect number of arguments for this rule type"));
  EXPECT_THAT(outcome.Operations({"set-file-label", "set-rule"}), IsEmpty());
}

TEST_F(TardiskPolicyTest, BadLineStopsTheFileAndTheRuleBeforeItStays) {
  Exception("-E web appDom\n-x\n-E mail appDom\n");
  const Outcome outcome = ParseAndSetOne();
  EXPECT_EQ(outcome.value, ParseError("exception", 2, "invalid tardisk policy rule type (-x)"));
  EXPECT_THAT(outcome.Operations({"set-file-label"}),
              ElementsAre("set-file-label /tardisks/vendor web"));
}

TEST_F(TardiskPolicyTest, FileOutsideEveryTardiskIsLoggedAndNotRead) {
  EmptyPolicyDirectory("base");
  LoadWellKnown({});
  StandIn::WriteBytes(InRoot(PolicyFilePath("exception")), "-x\n");
  const Outcome outcome = ParseAndSetOne();
  EXPECT_EQ(outcome.value + outcome.error, "");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("No backing tardisk for policy file " + PolicyFilePath("exception")));
  EXPECT_THAT(outcome.Operations(), ElementsAre("backing-tardisk"));
}

TEST_F(TardiskPolicyTest, UnknownBackingTardiskPassesUnchanged) {
  Exception("-E web appDom\n");
  Fail(Operation::kBackingTardisk);
  EXPECT_EQ(ParseAndSetOne().value, "refused on request: backing-tardisk, call 1");
  std::filesystem::remove(InRoot(PolicyFilePath("exception")));
  EXPECT_EQ(ParseAndSetOne().value, "Unable to open policy file " + PolicyFilePath("exception"));
}

TEST_F(TardiskPolicyTest, FirstRefusalPassesOutOfSetting) {
  Exception("-E web appDom\n");
  Fail(Operation::kSetRule);
  EXPECT_EQ(ParseAndSetOne().error,
            PolicyFilePath("exception") +
                ":1 : Tardisk: /tardisks/vendor : refused on request: set-rule, call 1");
}

TEST_F(TardiskPolicyTest, NoPoliciesSucceedAndAreLogged) {
  const Outcome outcome = ParseAndSet({});
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events, ElementsAre("info: Parsed all the tardisk policy files",
                                          "info: Set all the tardisk labels and policy"));
}

TEST_F(TardiskPolicyTest, AllAreParsedBeforeAnyIsInstalled) {
  TardiskPolicyFile("vendor", "one", "-E web appDom\n");
  TardiskPolicyFile("network", "two", "-E mail ioFilterDom\n");
  LoadWellKnown({"web", "mail"});
  const Outcome outcome = ParseAndSet({"two", "one"});
  EXPECT_EQ(outcome.error, "");
  std::vector<std::string> events = outcome.events;
  std::erase(events, "kernel: tardisk-launch-domain");
  std::erase(events, "kernel: tardisk-exec-event");
  const std::string two = "kernel: set-rule rootDom -d mail ioFilterDom exec grant # line 1 into 3";
  const std::string one = "kernel: set-rule rootDom -d web appDom exec grant # line 1 into 1";
  EXPECT_THAT(
      events,
      ElementsAre("kernel: backing-tardisk network", "kernel: find-domain ioFilterDom",
                  "kernel: backing-tardisk vendor", "kernel: find-domain appDom",
                  "info: Parsed all the tardisk policy files", "kernel: lookup-label object mail",
                  "kernel: set-file-label /tardisks/network mail", two, two,
                  "kernel: lookup-label object web", "kernel: set-file-label /tardisks/vendor web",
                  one, one, "info: Set all the tardisk labels and policy"));
}

TEST_F(TardiskPolicyTest, SecondRuleIsNamedWhileTheFirstIsInstalled) {
  Exception("-E web appDom\n\n-E mail appDom\n");
  const Outcome outcome = ParseAndSet({"exception"});
  EXPECT_EQ(outcome.error, "Failure in setting specified tardisk policy");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre(ParseError("exception", 3, "Only one rule of this type is allowed"),
                          "Error in parsing some tardisk policy files"));
  EXPECT_THAT(outcome.Infos(), ElementsAre("Set all the tardisk labels and policy"));
  EXPECT_EQ(LabelOf("/tardisks/vendor"), "web");
  EXPECT_EQ(Transitions(0).value, "web appDom exec into 1 line 1 grant\n");
}

TEST_F(TardiskPolicyTest, FailuresOfOneFileDoNotStopTheOthers) {
  TardiskPolicyFile("alpha", "bad", "-x\n");
  TardiskPolicyFile("beta", "refused", "-E shelf appDom\n");
  TardiskPolicyFile("gamma", "good", "-E web appDom\n");
  LoadWellKnown({"web"});
  const Outcome outcome = ParseAndSet({"bad", "refused", "good"});
  EXPECT_EQ(outcome.error, "Failure in setting specified tardisk policy");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre(ParseError("bad", 1, "invalid tardisk policy rule type (-x)"),
                          "Error in parsing some tardisk policy files",
                          PolicyFilePath("refused") +
                              ":1 : Tardisk: /tardisks/beta : no object label is named \"shelf\"",
                          "Error in setting some tardisk labels and policy"));
  EXPECT_THAT(outcome.Infos(), IsEmpty());
  EXPECT_EQ(LabelOf("/tardisks/gamma"), "web");
}

TEST_F(TardiskPolicyTest, RefusalAloneFailsAfterParsingSucceeded) {
  Exception("-E shelf appDom\n");
  const Outcome outcome = ParseAndSet({"exception"});
  EXPECT_EQ(outcome.error, "Failure in setting specified tardisk policy");
  EXPECT_THAT(outcome.Infos(), ElementsAre("Parsed all the tardisk policy files"));
  EXPECT_THAT(outcome.Errors(),
              ElementsAre(PolicyFilePath("exception") +
                              ":1 : Tardisk: /tardisks/vendor : no object label is named \"shelf\"",
                          "Error in setting some tardisk labels and policy"));
}

TEST_F(TardiskPolicyTest, FileOutsideEveryTardiskIsNoFailure) {
  EmptyPolicyDirectory("base");
  Assemble();
  StandIn::WriteBytes(InRoot(PolicyFilePath("own")), "-x\n");
  const Outcome outcome = ParseAndSet({"own"});
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Infos(), ElementsAre("Parsed all the tardisk policy files",
                                           "Set all the tardisk labels and policy"));
}

TEST_F(TardiskPolicyTest, OutOfMemoryPassesThroughUnlogged) {
  Exception("-E web appDom\n");
  for (const Operation operation :
       {Operation::kBackingTardisk, Operation::kFindDomain, Operation::kSetRule}) {
    FailNothing();
    Fail(Fault{.operation = operation, .kind = Fault::Kind::kOutOfMemory});
    const Outcome outcome = ParseAndSet({"exception"});
    EXPECT_EQ(outcome.error, "other: std::bad_alloc");
    EXPECT_THAT(outcome.Errors(), IsEmpty());
  }
}

}  // namespace
}  // namespace SecPolicyTest
