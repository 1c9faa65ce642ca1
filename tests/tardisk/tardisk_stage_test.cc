// The tardisk stage of a load, and the display of tardisk labels.
#include "tests/support/open_descriptors.h"
#include "tests/tardisk/tardisk_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class TardiskStageTest : public TardiskTest {
 protected:
  Outcome LoadTardisks(const std::string& dir = kTardiskPolicyDir) {
    return RunWithInterface([&](auto& iface) { SecPolicy::LoadPolicyTardisks(dir, iface); });
  }
  Outcome DisplayLabels() {
    return RunWithInterface([](auto& iface) { SecPolicy::DisplayPolicyTardiskLabels(iface); });
  }

  // The display's banner and a line a tardisk: what `label` says of it in brackets; none where it
  // says nothing.
  std::string Displayed(const std::map<std::string, std::string>& labels) {
    const std::string dashes(20, '-');
    std::string text = "\n\n" + dashes + "\nTardisk Path (label)\n\n" + dashes + "\n";
    for (const std::string& path : Mounted()) {
      const auto label = labels.find(path);
      if (label != labels.end()) text += path + " (" + label->second + ")\n";
    }
    return text;
  }
};

TEST_F(TardiskStageTest, WithoutPolicyFilesEveryTardiskGetsTheDefault) {
  PlainTardisks({"alpha", "beta"});
  EmptyPolicyDirectory("gamma");
  const Outcome outcome = LoadTardisks();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Infos(), ElementsAre("Parsed all the tardisk policy files",
                                           "Set all the tardisk labels and policy"));
  std::vector<std::string> expected{"set-rule rootDom -d tardisk appDom exec grant # into 0"};
  for (const std::string& path : Mounted()) {
    expected.push_back("set-file-label " + path + " tardisk");
  }
  EXPECT_EQ(expected.size(), 4u);
  EXPECT_EQ(outcome.Operations({"set-rule", "set-file-label"}), expected);
}

TEST_F(TardiskStageTest, MissingPolicyDirectorySetsTheDefaultRuleAndNoLabel) {
  PlainTardisks({"alpha", "beta"});
  const Outcome outcome = LoadTardisks();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(
      outcome.Infos(),
      ElementsAre("Skipping tardisk policy as /etc/olvane/secpolicy/tardisks does not exist",
                  "Parsed all the tardisk policy files", "Set all the tardisk labels and policy"));
  EXPECT_THAT(outcome.Operations({"set-rule", "set-file-label"}),
              ElementsAre("set-rule rootDom -d tardisk appDom exec grant # into 0"));
}

TEST_F(TardiskStageTest, ExceptionsComeBeforeTheDefault) {
  PlainTardisks({"base"});
  TardiskPolicyFile("vendor", "exception", "-E web appDom\n");
  LoadWellKnown({"web"});
  const Outcome outcome = LoadTardisks();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: backing-tardisk vendor",               //
                          "kernel: backing-tardisk vendor",               //
                          "kernel: find-domain appDom",                   //
                          "info: Parsed all the tardisk policy files",    //
                          "kernel: lookup-label object web",              //
                          "kernel: set-file-label /tardisks/vendor web",  //
                          "kernel: tardisk-launch-domain",                //
                          "kernel: tardisk-exec-event",                   //
                          "kernel: set-rule rootDom -d web appDom exec grant # line 1 into 1",
                          "kernel: set-rule rootDom -d web appDom exec grant # line 1 into 1",
                          "info: Set all the tardisk labels and policy",  //
                          "kernel: default-tardisk-label",                //
                          "kernel: default-tardisk-domain",               //
                          "kernel: tardisk-launch-domain",                //
                          "kernel: tardisk-exec-event",                   //
                          "kernel: find-domain rootDom",                  //
                          "kernel: set-rule rootDom -d tardisk appDom exec grant # into 0",
                          "kernel: lookup-label object tardisk",  //
                          "kernel: set-file-label /tardisks/base tardisk"));
}

TEST_F(TardiskStageTest, BadPolicyFileFailsTheStageAfterTheDefaultWasApplied) {
  PlainTardisks({"base"});
  TardiskPolicyFile("vendor", "exception", "-x\n");
  const Outcome outcome = LoadTardisks();
  EXPECT_EQ(outcome.error, "Failure in setting tardisk policy");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Error in parsing policy for domain: " + PolicyFilePath("exception") +
                              ": 1 : invalid tardisk policy rule type (-x)",
                          "Error in parsing some tardisk policy files",
                          "Failure in setting specified tardisk policy"));
  EXPECT_EQ(LabelOf("/tardisks/base"), "tardisk");
  EXPECT_EQ(LabelOf("/tardisks/vendor"), "default");
}

TEST_F(TardiskStageTest, FailuresOfBothKindsAreThrownOnce) {
  PlainTardisks({"base"});
  TardiskPolicyFile("vendor", "exception", "-x\n");
  Fail(Operation::kSetFileLabel, 1, EACCES);
  const Outcome outcome = LoadTardisks();
  EXPECT_EQ(outcome.error, "Failure in setting tardisk policy");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Error in parsing policy for domain: " + PolicyFilePath("exception") +
                              ": 1 : invalid tardisk policy rule type (-x)",
                          "Error in parsing some tardisk policy files",
                          "Failure in setting specified tardisk policy",
                          "Failed to set default tardisk label: ",
                          "Unable to set file label (tardisk) for file /tardisks/base: "
                          "Permission denied",
                          "Failure in setting default tardisk policy"));
}

TEST_F(TardiskStageTest, UnknownLaunchDomainIsLoggedByTheStage) {
  Describe(R"({"format": 1, "tardisks": {"launchDomain": "noDom"}})");
  PlainTardisks({"base"});
  const Outcome outcome = LoadTardisks();
  EXPECT_EQ(outcome.error, "Failure in setting tardisk policy");
  EXPECT_THAT(outcome.Errors(), ElementsAre("Failed to fetch domain id for noDom"));
}

TEST_F(TardiskStageTest, MissingTardiskDirectoryPassesOutWithNothingInstalled) {
  Assemble();
  std::filesystem::remove_all(InRoot("/tardisks"));
  const Outcome outcome = LoadTardisks();
  EXPECT_EQ(outcome.error, "Could not open tardisk dir /tardisks/");
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(TardiskStageTest, FailedDiscoveryPassesOutWithNothingInstalled) {
  TardiskPolicyFile("alpha", "one", "-E web appDom\n");
  TardiskPolicyFile("beta", "two", "-E web appDom\n");
  Fail(Operation::kBackingTardisk, 3);  // one policy has been accepted by then
  const Outcome outcome = LoadTardisks();
  EXPECT_EQ(outcome.error, "refused on request: backing-tardisk, call 3");
  EXPECT_THAT(outcome.Operations({"set-rule", "set-file-label", "default-tardisk-label"}),
              IsEmpty());
  EXPECT_THAT(outcome.Errors(), IsEmpty());
}

TEST_F(TardiskStageTest, OutOfMemoryPassesThroughUnloggedAndLeavesNothingOpen) {
  PlainTardisks({"base"});
  TardiskPolicyFile("vendor", "exception", "-E web appDom\n");
  LoadWellKnown({"web"});
  for (const Operation operation : {Operation::kBackingTardisk, Operation::kSetRule,
                                    Operation::kLookupLabel, Operation::kDefaultTardiskLabel}) {
    FailNothing();
    Fail(Fault{.operation = operation, .kind = Fault::Kind::kOutOfMemory});
    const Outcome outcome = RunWithInterface([](auto& iface) {
      const int before = OpenDescriptors();
      try {
        SecPolicy::LoadPolicyTardisks(kTardiskPolicyDir, iface);
      } catch (const std::bad_alloc&) {
        return std::to_string(OpenDescriptors() - before) + " left open";
      }
      return std::string("not thrown");
    });
    EXPECT_EQ(outcome.value, "0 left open") << StandIn::InfoOf(operation).name;
    EXPECT_THAT(outcome.Errors(), IsEmpty());
  }
}

TEST_F(TardiskStageTest, DisplayIsABannerAndALineATardisk) {
  PlainTardisks({"alpha", "beta"});
  TardiskPolicyFile("vendor", "exception", "-E web appDom\n");
  LoadWellKnown({"web"});
  LoadTardisks();
  const Outcome outcome = DisplayLabels();
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.out, Displayed({{"/tardisks/alpha", "tardisk"},
                                    {"/tardisks/beta", "tardisk"},
                                    {"/tardisks/vendor", "web"}}));
  EXPECT_EQ(outcome.err, "");
  EXPECT_THAT(outcome.Operations({"get-file-label", "label-name"}), testing::SizeIs(6));
}

TEST_F(TardiskStageTest, DisplayLogsATardiskWhoseLabelCannotBeReadAndGoesOn) {
  PlainTardisks({"alpha", "beta"});
  Assemble();
  StandIn::WriteBytes(InRoot("/tardisks/added"), "");
  const Outcome outcome = DisplayLabels();
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.out,
            Displayed({{"/tardisks/alpha", "default"}, {"/tardisks/beta", "default"}}));
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Error in reading tardisk label: (/tardisks/added): Unable to get file "
                          "label for file /tardisks/added:No data available"));
}

TEST_F(TardiskStageTest, DisplayLogsALabelThatHasNoName) {
  PlainTardisks({"alpha"});
  Fail(Operation::kLabelName);
  const Outcome outcome = DisplayLabels();
  EXPECT_EQ(outcome.out, Displayed({}));
  EXPECT_THAT(outcome.Errors(), ElementsAre("Error in reading tardisk label: (/tardisks/alpha): "
                                            "refused on request: label-name, call 1"));
}

TEST_F(TardiskStageTest, DisplayWithoutTheDirectoryEndsBehindItsBanner) {
  Assemble();
  std::filesystem::remove_all(InRoot("/tardisks"));
  const Outcome outcome = DisplayLabels();
  EXPECT_EQ(outcome.error, "Could not open tardisk dir /tardisks/");
  EXPECT_TRUE(outcome.out.ends_with("-\n")) << outcome.out;
}

TEST_F(TardiskStageTest, DisplayPassesOutOfMemoryThrough) {
  PlainTardisks({"alpha"});
  Fail(Fault{.operation = Operation::kLabelName, .kind = Fault::Kind::kOutOfMemory});
  const Outcome outcome = DisplayLabels();
  EXPECT_EQ(outcome.error, "other: std::bad_alloc");
  EXPECT_THAT(outcome.Errors(), IsEmpty());
}

}  // namespace
}  // namespace SecPolicyTest
