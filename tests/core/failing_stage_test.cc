// What a load makes of a stage that fails with a message: it logs it, goes on, and says so at the
// end.
#include "tests/core/load_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::Contains;
using testing::HasSubstr;
using testing::Not;

constexpr char kSystemTardisks[] = "/etc/olvane/secpolicy/tardisks";
constexpr char kTardiskFile[] = "etc/olvane/secpolicy/tardisks/base";

class FailingStageTest : public LoadTest {
 protected:
  // Loads, and expects these messages and what is installed all the same.
  void ExpectLoadReports(const std::vector<std::string>& errors,
                         const std::vector<std::string>& installed) {
    const Outcome outcome = Load();
    EXPECT_EQ(outcome.error, "There were some problems encountered in setting the policy");
    EXPECT_EQ(outcome.Errors(), errors);
    EXPECT_EQ(outcome.err, AsLines(errors));
    EXPECT_EQ(Installed(outcome), installed);
    EXPECT_THAT(outcome.Infos(), Not(Contains("System security policy has been set successfully")));
    ExpectClosedInterface(outcome);
  }
};

TEST_F(FailingStageTest, MissingObjectDirectory) {
  Remove("objects");
  Remove("fileLabels/main");  // its label is an object
  ExpectLoadReports({"Unable to open policy directory " + PolicyPath("objects")},
                    AllBut({kObjectsSet, kFileLabelsSet}));
}

TEST_F(FailingStageTest, BadObjectFileDoesNotHideTheGoodOne) {
  Policy("objects/bad", "one two\n");
  ExpectLoadReports({PolicyPath("objects/bad") + ":1 : cannot define more than one object per line",
                     "Error in parsing some object files", "Failure in object policy"},
                    AllBut({}));
}

TEST_F(FailingStageTest, RefusedObjects) {
  Load();
  Fail(Operation::kAddLabels, 2);
  ExpectLoadReports({"Error in defining some objects", "Failure in object policy"},
                    AllBut({kObjectsSet}));
}

TEST_F(FailingStageTest, MissingDomainDirectoryWhenTheDomainsExist) {
  Load();
  Remove("domains");
  ExpectLoadReports({"Unable to open policy directory " + PolicyPath("domains")},
                    AllBut({kDomainsSet}));
}

TEST_F(FailingStageTest, RefusedDomainLeavesAllRulesOut) {
  Load();
  Policy("domains/zoneDom", "");
  Fail(Operation::kCreateDomain);
  ExpectLoadReports({"Failed to create domain: zoneDom"}, AllBut({kDomainsSet}));
}

TEST_F(FailingStageTest, BadDomainLineKeepsTheLinesBeforeIt) {
  Policy("domains/appDom", "-s read grant\n-x read grant\n-s write grant\n");
  ExpectLoadReports(
      {"Error in parsing policy for domain: appDom: 2 : invalid policy rule type (-x)",
       "Error in parsing the policy for some domains", "Failure in domain policy"},
      AllBut({}));
}

TEST_F(FailingStageTest, ContradictoryDomain) {
  Fail(Operation::kCheckCapabilityParams);
  const std::string refusal = "refused on request: check-capability-params, call 1";
  ExpectLoadReports({"Policy constraint error for domain: appDom : " + refusal,
                     "Error in policy constraints check for some domains",
                     "Skipping the policy for domain appDom due to errors in the policy",
                     "Error in setting the policy for some domains", "Failure in domain policy"},
                    AllBut({kDomainsSet}));
}

TEST_F(FailingStageTest, RefusedRule) {
  Fail(Operation::kSetRule);
  ExpectLoadReports(
      {"Error in setting policy for domain: appDom: 1 : refused on request: set-rule, call 1",
       "Error in setting the policy for some domains", "Failure in domain policy"},
      AllBut({kDomainsSet}));
}

TEST_F(FailingStageTest, MissingTardiskDirectory) {
  Assemble();
  std::filesystem::remove_all(InRoot("/tardisks"));
  ExpectLoadReports({"Could not open tardisk dir /tardisks/"}, AllBut({kTardisksSet}));
}

TEST_F(FailingStageTest, TardiskPolicyThatIsNotADirectory) {
  Tardisk("base.tgz").File("etc/olvane/secpolicy/tardisks", "");
  ExpectLoadReports(
      {std::string("Unable to open policy directory for tardisks ") + kSystemTardisks},
      AllBut({kTardisksSet}));
}

TEST_F(FailingStageTest, BadTardiskLine) {
  Tardisk("base.tgz").File(kTardiskFile, "-Q tardisk appDom\n");
  ExpectLoadReports(
      {std::string("Error in parsing policy for domain: /") + kTardiskFile +
           ": 1 : invalid tardisk policy rule type (-Q)",
       "Error in parsing some tardisk policy files", "Failure in setting specified tardisk policy",
       "Failure in setting tardisk policy"},
      AllBut({}));
}

TEST_F(FailingStageTest, RefusedDefaultTransition) {
  Fail(Operation::kSetRule, 2);
  ExpectLoadReports(
      {"Failed to set default tardisk rule: ", "refused on request: set-rule, call 2",
       "Failure in setting default tardisk policy", "Failure in setting tardisk policy"},
      AllBut({kTardisksSet}));
}

TEST_F(FailingStageTest, MissingFileLabelDirectory) {
  Remove("fileLabels");
  ExpectLoadReports({"Unable to open policy directory " + PolicyPath("fileLabels")},
                    AllBut({kFileLabelsSet}));
}

TEST_F(FailingStageTest, BadFileLabelLineKeepsTheLinesBeforeIt) {
  const std::string file = PolicyPath("fileLabels/main");
  Policy("fileLabels/main", "/bin/tool apps\n/bin/tool\n");
  ExpectLoadReports({"Error parsing file " + file, file + ":2 : incorrect no of parameters",
                     "Error in parsing some file label mappings.", "Failure in file labels policy"},
                    AllBut({}));
}

TEST_F(FailingStageTest, RefusedFileLabel) {
  Fail(Operation::kSetFileLabel);
  ExpectLoadReports(
      {PolicyPath("fileLabels/main") +
           ":1 : Unable to set file label (apps) for file /bin/tool: Input/output error",
       "There was a failure in setting file labels", "Error in setting some file labels.",
       "Failure in file labels policy"},
      AllBut({kFileLabelsSet}));
}

TEST_F(FailingStageTest, AllStagesAreReportedInTheirOrder) {
  Load();
  for (const char* dir : {"objects", "domains", "fileLabels"}) Remove(dir);
  std::filesystem::remove_all(InRoot("/tardisks"));
  ExpectLoadReports({"Unable to open policy directory " + PolicyPath("objects"),
                     "Unable to open policy directory " + PolicyPath("domains"),
                     "Could not open tardisk dir /tardisks/",
                     "Unable to open policy directory " + PolicyPath("fileLabels")},
                    {kGlobalVMSet, kIoFilterSet});
}

TEST_F(FailingStageTest, WhatWasInstalledStaysInTheKernel) {
  Remove("fileLabels");
  Load();
  const Outcome shown = Display("1");
  EXPECT_THAT(shown.out, HasSubstr("Domain Name: appDom "));
  EXPECT_THAT(shown.out, HasSubstr("\n-s read grant\n"));
  EXPECT_THAT(shown.out, HasSubstr("\napps ("));
}

TEST_F(FailingStageTest, LaterLoadIsNotToldOfAnEarlierFailure) {
  Policy("objects/bad", "one two\n");
  Assemble();
  const Outcome outcome = Run([&] {
    try {
      SecPolicy::LoadPolicy(PolicyDir());
    } catch (const Tavon::Lib::TavonException&) {
      Remove("objects/bad");
    }
    SecPolicy::LoadPolicy(PolicyDir());
  });
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.Infos().back(), "System security policy has been set successfully");
}

}  // namespace
}  // namespace SecPolicyTest
