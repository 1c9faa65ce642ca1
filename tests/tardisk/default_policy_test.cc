// The label and the transition of tardisks without a policy of their own.
#include "tests/tardisk/tardisk_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class DefaultPolicyTest : public TardiskTest {
 protected:
  DefaultPolicyTest() { PlainTardisks({"alpha", "beta", "gamma"}); }

  Outcome SetDefault(std::list<std::string> tardisks) {
    return RunWithInterface(
        [&](auto& iface) { SecPolicy::SetDefaultTardiskPolicy(tardisks, iface); });
  }
};

TEST_F(DefaultPolicyTest, AsksThePlatformThenSetsTheRuleThenTheLabels) {
  const Outcome outcome = SetDefault({"/tardisks/gamma", "/tardisks/alpha"});
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: default-tardisk-label", "kernel: default-tardisk-domain",
                          "kernel: tardisk-launch-domain", "kernel: tardisk-exec-event",
                          "kernel: find-domain rootDom",
                          "kernel: set-rule rootDom -d tardisk appDom exec grant # into 0",
                          "kernel: lookup-label object tardisk",
                          "kernel: set-file-label /tardisks/gamma tardisk",
                          "kernel: lookup-label object tardisk",
                          "kernel: set-file-label /tardisks/alpha tardisk"));
  EXPECT_EQ(LabelOf("/tardisks/beta"), "default");
}

TEST_F(DefaultPolicyTest, RuleIsSetOnceAndWithoutTardisksToo) {
  const Outcome outcome = SetDefault({});
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Operations({"set-rule", "set-file-label"}),
              ElementsAre("set-rule rootDom -d tardisk appDom exec grant # into 0"));
  EXPECT_EQ(Transitions(0).value, "tardisk appDom exec into 0 line 0 grant\n");
}

TEST_F(DefaultPolicyTest, EveryWordIsThePlatforms) {
  Describe(R"({"format": 1, "words": {"transitionEvents": ["start"]},
               "tardisks": {"launchDomain": "ioFilterDom", "execEvent": "start",
                            "defaultLabel": "disk", "defaultDomain": "elsewhereDom"}})");
  LoadWellKnown({"disk"});
  const Outcome outcome = SetDefault({"/tardisks/beta"});
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Operations({"find-domain", "set-rule", "set-file-label"}),
              ElementsAre("find-domain ioFilterDom",
                          "set-rule ioFilterDom -d disk elsewhereDom start grant # into 0",
                          "set-file-label /tardisks/beta disk"));
}

TEST_F(DefaultPolicyTest, TargetsIdIsThatOfTheWellKnownDomainWhateverThePlatformsName) {
  Describe(R"({"format": 1, "tardisks": {"defaultDomain": "elsewhereDom"}})");
  WellKnownDomains();
  EXPECT_THAT(Load().Operations({"set-rule"}),
              ElementsAre("set-rule rootDom -d tardisk elsewhereDom exec grant # into 1"));
}

TEST_F(DefaultPolicyTest, UnknownLaunchDomainEndsItWithNothingInstalled) {
  Describe(R"({"format": 1, "tardisks": {"launchDomain": "noDom"}})");
  const Outcome outcome = SetDefault({"/tardisks/alpha"});
  EXPECT_EQ(outcome.error, "Failed to fetch domain id for noDom");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: default-tardisk-label", "kernel: default-tardisk-domain",
                          "kernel: tardisk-launch-domain", "kernel: tardisk-exec-event",
                          "kernel: find-domain noDom"));
}

TEST_F(DefaultPolicyTest, RefusedQuestionPassesThroughWithNothingInstalled) {
  for (const Operation operation :
       {Operation::kDefaultTardiskLabel, Operation::kDefaultTardiskDomain,
        Operation::kTardiskLaunchDomain, Operation::kTardiskExecEvent, Operation::kFindDomain}) {
    FailNothing();
    Fail(operation);
    const Outcome outcome = SetDefault({"/tardisks/alpha"});
    EXPECT_EQ(outcome.error,
              "refused on request: " + std::string(StandIn::InfoOf(operation).name) + ", call 1");
    EXPECT_THAT(outcome.Operations({"set-rule", "set-file-label"}), IsEmpty());
    EXPECT_THAT(outcome.Errors(), IsEmpty());
  }
}

TEST_F(DefaultPolicyTest, RefusedRuleIsLoggedOnTwoLinesAndTheLabelsAreSet) {
  Fail(Operation::kSetRule);
  const Outcome outcome = SetDefault({"/tardisks/alpha", "/tardisks/beta"});
  EXPECT_EQ(outcome.error, "Failure in setting default tardisk policy");
  EXPECT_EQ(outcome.err,
            "Error: Failed to set default tardisk rule: \n"
            "Error: refused on request: set-rule, call 1\n");
  EXPECT_THAT(outcome.Errors(), ElementsAre("Failed to set default tardisk rule: ",
                                            "refused on request: set-rule, call 1"));
  EXPECT_THAT(outcome.Operations({"set-file-label"}), testing::SizeIs(2));
}

TEST_F(DefaultPolicyTest, RefusedLabelIsLoggedOnTwoLinesAndTheOthersAreSet) {
  Fail(Operation::kSetFileLabel, 2, EACCES);
  const Outcome outcome = SetDefault({"/tardisks/alpha", "/tardisks/beta", "/tardisks/gamma"});
  EXPECT_EQ(outcome.error, "Failure in setting default tardisk policy");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Failed to set default tardisk label: ",
                          "Unable to set file label (tardisk) for file /tardisks/beta: "
                          "Permission denied"));
  FailNothing();
  EXPECT_EQ(LabelOf("/tardisks/alpha"), "tardisk");
  EXPECT_EQ(LabelOf("/tardisks/beta"), "default");
  EXPECT_EQ(LabelOf("/tardisks/gamma"), "tardisk");
}

TEST_F(DefaultPolicyTest, LabelThatIsNotDefinedFailsTheRuleAndEveryTardisk) {
  Describe(R"({"format": 1, "tardisks": {"defaultLabel": "shelf"}})");
  const Outcome outcome = SetDefault({"/tardisks/alpha", "/tardisks/beta"});
  EXPECT_EQ(outcome.error, "Failure in setting default tardisk policy");
  const std::vector<std::string> errors = outcome.Errors();
  ASSERT_EQ(errors.size(), 6u);
  EXPECT_EQ(errors[0], "Failed to set default tardisk rule: ");
  for (const std::size_t at : {2U, 4U}) {
    EXPECT_EQ(errors[at], "Failed to set default tardisk label: ");
    EXPECT_EQ(errors[at + 1], "no object label is named \"shelf\"");
  }
}

TEST_F(DefaultPolicyTest, OutOfMemoryPassesThroughUnlogged) {
  for (const Operation operation : {Operation::kSetRule, Operation::kLookupLabel}) {
    FailNothing();
    Fail(Fault{.operation = operation, .kind = Fault::Kind::kOutOfMemory});
    const Outcome outcome = SetDefault({"/tardisks/alpha"});
    EXPECT_EQ(outcome.error, "other: std::bad_alloc");
    EXPECT_THAT(outcome.Errors(), IsEmpty());
  }
}

}  // namespace
}  // namespace SecPolicyTest
