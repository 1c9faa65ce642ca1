// Keeping the kernel's labels in step with the policy's: the order of the kernel's operations and
// the reports.
#include "tests/labels/labels_fixture.h"

namespace SecPolicyTest {
namespace {

using SecPolicy::SyncLabelsFromPolicy;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

using Labels = std::vector<std::string>;
using Existing = std::map<std::string, long>;

constexpr char kHost[] = R"({
  "format": 1,
  "labels": {"domain": {"predefined": ["baseGuest"], "invalid": ["lost"]},
             "object": {"predefined": ["default", "tardisk"], "invalid": ["stale", "torn"]}},
  "privilegedVms": ["guard"]})";

class LabelSyncTest : public LabelsTest {
 protected:
  LabelSyncTest() { Describe(kHost); }

  Outcome Sync(const Labels& policy, const Existing& existing, ZekAccessLabelType type) {
    return RunWithInterface(
        [&](auto& iface) { SyncLabelsFromPolicy(policy, existing, type, iface); });
  }

  // The obsolete labels, each followed by a blank.
  Outcome Obsolete(const Labels& policy, const Existing& existing, ZekAccessLabelType type) {
    return RunWithInterface([&](auto& iface) {
      std::string text;
      for (const std::string& label : SecPolicy::GetObsoleteLabels(policy, existing, type, iface)) {
        text += label + " ";
      }
      return text;
    });
  }
};

TEST_F(LabelSyncTest, ObjectsAreMadeValidThenRemovedThenAdded) {
  Define({"stale", "torn", "old", "web"});
  const Outcome outcome =
      Sync({"web", "mail"}, {{"default", 1}, {"old", 5}, {"stale", 3}, {"web", 6}}, kObjectLabel);
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(
      outcome.events,
      ElementsAre("kernel: invalid-labels object",            //
                  "kernel: remove-labels object stale torn",  //
                  "kernel: add-labels object stale torn",     //
                  "info: The values of the following objects have been changed:", "info: stale",
                  "info: torn",                                                                  //
                  "kernel: predefined-label object default",                                     //
                  "kernel: predefined-label object old",                                         //
                  "kernel: predefined-label object stale",                                       //
                  "kernel: remove-labels object old stale",                                      //
                  "info: The following objects have been removed:", "info: old", "info: stale",  //
                  "kernel: add-labels object web mail"));
}

TEST_F(LabelSyncTest, DomainLabelsHaveWordsOfTheirOwnAndSparePrivilegedMachines) {
  Define({"lost"}, kDomainLabel);
  const Outcome outcome =
      Sync({"web"}, {{"baseGuest", 1}, {"gone", 2}, {"guard", 3}, {"web", 4}}, kDomainLabel);
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: invalid-labels domain",      //
                          "kernel: remove-labels domain lost",  //
                          "kernel: add-labels domain lost",     //
                          "info: The values of the following domains have been changed:",
                          "info: lost",                                 //
                          "kernel: privileged-vm baseGuest",            //
                          "kernel: predefined-label domain baseGuest",  //
                          "kernel: privileged-vm gone",                 //
                          "kernel: predefined-label domain gone",       //
                          "kernel: privileged-vm guard",                //
                          "kernel: privileged-vm web",                  //
                          "kernel: remove-labels domain gone",          //
                          "info: The following domains have been removed:",
                          "info: gone",  //
                          "kernel: add-labels domain web"));
}

TEST_F(LabelSyncTest, EmptyListsStillReachTheKernelAndAreNotReported) {
  const Outcome outcome = Sync({}, {}, kObjectLabel);
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: invalid-labels object", "kernel: remove-labels object",
                          "kernel: add-labels object", "kernel: remove-labels object",
                          "kernel: add-labels object"));
}

TEST_F(LabelSyncTest, WholePolicyListIsAddedWithDuplicatesAndWhatTheKernelHas) {
  Define({"web"});
  const Outcome outcome = Sync({"web", "mail", "web"}, {{"web", 3}}, kObjectLabel);
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Operations({"add-labels"}),
              ElementsAre("add-labels object", "add-labels object web mail web"));
  EXPECT_THAT(Objects(),
              ElementsAre(Pair("default", 1), Pair("mail", 4), Pair("tardisk", 2), Pair("web", 3)));
}

TEST_F(LabelSyncTest, InvalidLabelsGetFreshIds) {
  Define({"stale"});
  EXPECT_EQ(Sync({"stale"}, {{"stale", 3}}, kObjectLabel).error, "");
  EXPECT_THAT(Objects(), ElementsAre(Pair("default", 1), Pair("stale", 4), Pair("tardisk", 2)));
}

TEST_F(LabelSyncTest, LabelsThatOnlyTheKernelKnowsOfStay) {
  Define({"unlisted"});
  EXPECT_EQ(Sync({}, {}, kObjectLabel).error, "");
  EXPECT_THAT(Objects(), ElementsAre(Pair("default", 1), Pair("tardisk", 2), Pair("unlisted", 3)));
}

TEST_F(LabelSyncTest, ObsoleteLabelsAreChosenByNameInTheirOrder) {
  struct Case {
    Labels policy;
    Existing existing;
    ZekAccessLabelType type;
    std::string obsolete;
  };
  const Case cases[] = {
      {{}, {}, kObjectLabel, ""},
      {{}, {{"b", 1}, {"a", 2}, {"B", 3}}, kObjectLabel, "B a b "},
      {{"a"}, {{"a", 1}}, kObjectLabel, ""},
      {{"A", "aa", "a "}, {{"a", 1}}, kObjectLabel, "a "},  // exact comparison only
      {{}, {{"default", 1}, {"tardisk", 2}, {"x", 3}}, kObjectLabel, "x "},
      {{}, {{"default", 1}}, kDomainLabel, "default "},  // predefined as an object only
      {{}, {{"guard", 1}}, kObjectLabel, "guard "},      // privileged only among domains
      {{}, {{"guard", 1}, {"baseGuest", 2}, {"x", 3}}, kDomainLabel, "x "},
      {{"x", "x"}, {{"x", 3}, {"y", 4}}, kDomainLabel, "y "},
  };
  for (const Case& row : cases) {
    EXPECT_EQ(Obsolete(row.policy, row.existing, row.type).value, row.obsolete)
        << testing::PrintToString(row.policy) << " against "
        << testing::PrintToString(row.existing);
  }
}

TEST_F(LabelSyncTest, LabelOfThePolicyIsNotAskedAbout) {
  EXPECT_THAT(Obsolete({"a"}, {{"a", 1}}, kObjectLabel).events, IsEmpty());
  EXPECT_THAT(Obsolete({"a"}, {{"a", 1}}, kDomainLabel).events,
              ElementsAre("kernel: privileged-vm a"));
}

TEST_F(LabelSyncTest, ReportsAreAHeadingAndALineALabel) {
  const Outcome outcome = Run([] {
    SecPolicy::PrintInvalidLabels({"b", "a"}, kDomainLabel);
    SecPolicy::PrintInvalidLabels({"%d"}, kObjectLabel);
    SecPolicy::PrintObsoleteLabels({"c"}, kDomainLabel);
    SecPolicy::PrintObsoleteLabels({"d"}, static_cast<ZekAccessLabelType>(7));
    SecPolicy::PrintInvalidLabels({"e"}, static_cast<ZekAccessLabelType>(7));
  });
  EXPECT_THAT(
      outcome.events,
      ElementsAre("info: The values of the following domains have been changed:", "info: b",
                  "info: a", "info: The values of the following objects have been changed:",
                  "info: %d", "info: The following domains have been removed:", "info: c",
                  "info: The following objects have been removed:", "info: d",
                  "info: The values of the following objects have been changed:", "info: e"));
  EXPECT_EQ(outcome.out + outcome.err, "");
}

TEST_F(LabelSyncTest, EmptyReportsPrintNothing) {
  const Outcome outcome = Run([] {
    SecPolicy::PrintInvalidLabels({}, kDomainLabel);
    SecPolicy::PrintInvalidLabels({}, kObjectLabel);
    SecPolicy::PrintObsoleteLabels({}, kDomainLabel);
    SecPolicy::PrintObsoleteLabels({}, kObjectLabel);
  });
  EXPECT_THAT(outcome.events, IsEmpty());
}

// A call of the synchronisation that the kernel refuses, and what had been done by then.
struct RefusedStep {
  Operation operation;
  std::uint64_t call;
  std::vector<std::string> events;
};

void PrintTo(const RefusedStep& step, std::ostream* stream) {
  *stream << StandIn::InfoOf(step.operation).name << ", call " << step.call;
}

class RefusedSyncTest : public LabelSyncTest, public testing::WithParamInterface<RefusedStep> {};

TEST_P(RefusedSyncTest, EndsTheSynchronisationWithTheKernelsReason) {
  Define({"stale", "old"});
  Fail(GetParam().operation, GetParam().call);
  const Outcome outcome = Sync({"web"}, {{"old", 4}}, kObjectLabel);
  const std::string reason =
      "refused on request: " + std::string(StandIn::InfoOf(GetParam().operation).name) + ", call " +
      std::to_string(GetParam().call);
  EXPECT_EQ(outcome.error, reason);
  std::vector<std::string> expected = GetParam().events;
  expected.back() += " ! " + reason;
  EXPECT_EQ(outcome.events, expected);
}

const char kHeading[] = "info: The values of the following objects have been changed:";

INSTANTIATE_TEST_SUITE_P(
    EachCall, RefusedSyncTest,
    testing::Values(
        RefusedStep{Operation::kInvalidLabels, 1, {"kernel: invalid-labels object"}},
        RefusedStep{Operation::kRemoveLabels,
                    1,
                    {"kernel: invalid-labels object", "kernel: remove-labels object stale"}},
        RefusedStep{Operation::kAddLabels,
                    1,
                    {"kernel: invalid-labels object", "kernel: remove-labels object stale",
                     "kernel: add-labels object stale"}},
        RefusedStep{Operation::kPredefinedLabel,
                    1,
                    {"kernel: invalid-labels object", "kernel: remove-labels object stale",
                     "kernel: add-labels object stale", kHeading, "info: stale",
                     "kernel: predefined-label object old"}},
        RefusedStep{Operation::kRemoveLabels,
                    2,
                    {"kernel: invalid-labels object", "kernel: remove-labels object stale",
                     "kernel: add-labels object stale", kHeading, "info: stale",
                     "kernel: predefined-label object old", "kernel: remove-labels object old"}},
        RefusedStep{Operation::kAddLabels,
                    2,
                    {"kernel: invalid-labels object", "kernel: remove-labels object stale",
                     "kernel: add-labels object stale", kHeading, "info: stale",
                     "kernel: predefined-label object old", "kernel: remove-labels object old",
                     "info: The following objects have been removed:", "info: old",
                     "kernel: add-labels object web"}}));

TEST_F(LabelSyncTest, RefusedQuestionForPrivilegePassesThrough) {
  Fail(Operation::kPrivilegedVm);
  EXPECT_EQ(Obsolete({}, {{"a", 1}}, kDomainLabel).error,
            "refused on request: privileged-vm, call 1");
}

TEST_F(LabelSyncTest, RefusedAddingLeavesTheRemovalsDone) {
  Define({"old"});
  Fail(Operation::kAddLabels, 2);
  Sync({"web"}, {{"old", 3}}, kObjectLabel);
  FailNothing();
  EXPECT_THAT(Objects(), ElementsAre(Pair("default", 1), Pair("tardisk", 2)));
}

}  // namespace
}  // namespace SecPolicyTest
