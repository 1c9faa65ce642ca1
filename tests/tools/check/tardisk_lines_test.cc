// What is wrong with policy files of tardisks.
#include "tests/tools/check/check_fixture.h"

namespace SecPolicyTool {
namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::UnorderedElementsAre;

const std::string kDir = "/etc/olvane/secpolicy/tardisks/";

class TardiskLinesTest : public CheckTest {
 protected:
  void SetUp() override {}

  // The finished host, with such a file in its second tardisk.
  void MakeHostWith(const std::string& text) {
    vendor_.File("etc/olvane/secpolicy/tardisks/vendor", text);
    MakeCheckHost();
  }

  void OwnTardisk(const std::string& text) const {
    std::filesystem::create_directory(PolicyDir() + "/tardisks");
    Policy("tardisks/vendor", text);
  }
};

TEST_F(TardiskLinesTest, GoodExceptionHasNoFindingsAndIsAReference) {
  Policy("objects/vendor", "vendorApp\n");
  Policy("domains/vendorDom", "-s open grant\n");
  MakeHostWith("# vendor\n-E vendorApp vendorDom\n");
  EXPECT_THAT(Found(), IsEmpty());
}

TEST_F(TardiskLinesTest, EveryBadWordIsShown) {
  MakeHostWith("-e conf appDom\n-E cnof appDm\n-E conf appDom\n");
  const std::string file = kDir + "vendor";
  EXPECT_THAT(
      Found(),
      ElementsAre(file + ":1:1: error: invalid tardisk policy rule type (-e) [unknown-rule-type]",
                  file + ":2:4: error: no object label is named \"cnof\" [undefined-tardisk-label]",
                  file + ":2:9: error: Failed to fetch domain id for appDm [unknown-domain]",
                  file + ":3:1: error: Only one rule of this type is allowed [second-exception]"));
  EXPECT_EQ(Findings()[1].help, "did you mean \"conf\"?");
  EXPECT_THAT(LoadErrorsOf(), Contains(Findings()[0].loadMessage));
}

TEST_F(TardiskLinesTest, WordCountIsSaidInTheWordsOfALoad) {
  MakeHostWith("-E conf appDom grant\n");
  const auto findings = Findings();
  ASSERT_EQ(findings.size(), 1U);
  EXPECT_EQ(findings[0].id, "word-count");
  EXPECT_EQ(LoadErrorsOf().at(0), findings[0].loadMessage);
}

TEST_F(TardiskLinesTest, UndefinedLabelIsReportedByALoad) {
  MakeHostWith("-E nothing appDom\n");
  const auto findings = Findings();
  ASSERT_EQ(findings.size(), 1U);
  EXPECT_EQ(findings[0].loadMessage, kDir + "vendor:1 : Tardisk: /tardisks/vendor.tar : " +
                                         "no object label is named \"nothing\"");
  EXPECT_EQ(LoadErrorsOf().at(0), findings[0].loadMessage);
}

TEST_F(TardiskLinesTest, TwoFilesOfOneTardisk) {
  vendor_.File("etc/olvane/secpolicy/tardisks/other", "-E conf appDom\n");
  MakeHostWith("-E conf appDom\n");
  const auto findings = Findings();
  ASSERT_EQ(findings.size(), 1U);
  EXPECT_EQ(findings[0].id, "duplicate-tardisk-policy");
  EXPECT_THAT(LoadErrorsOf(),
              ElementsAre(findings[0].loadMessage, "Ignoring " + findings[0].place.file.Text()));
}

TEST_F(TardiskLinesTest, FileOfNoTardiskAndDirectory) {
  MakeHostWith("-E conf appDom\n");
  Policy("fileLabels/base", "");
  const std::string dir = Host() + "/root" + kDir;
  StandIn::WriteBytes(dir + "alien", "-E cnof appDom\n");
  std::filesystem::create_directory(dir + "sub");
  EXPECT_THAT(
      Found(),
      ElementsAre(kDir + "alien: error: the file comes from no tardisk, and a load ignores it "
                         "[no-backing-tardisk]",
                  kDir + "alien:1:4: warning: unknown object label \"cnof\" (nearest: conf) "
                         "[undefined-tardisk-label]",
                  kDir + "sub: error: a directory, which a load passes over [skipped-entry]"));
  EXPECT_THAT(LoadErrorsOf(),
              UnorderedElementsAre("Skipping directory sub",
                                   "No backing tardisk for policy file " + kDir + "alien"));
}

TEST_F(TardiskLinesTest, OwnDirectoryIsCheckedAlthoughALoadDoesNotReadIt) {
  MakeCheckHost();
  OwnTardisk("-E cnof appDm\n-x\n");
  EXPECT_THAT(
      Found(),
      ElementsAre(
          "tardisks: warning: a load reads tardisk policy from the host's own "
          "/etc/olvane/secpolicy/tardisks, and not from here [skipped-entry]",
          "tardisks/vendor:1:4: warning: unknown object label \"cnof\" (nearest: conf) "
          "[undefined-tardisk-label]",
          "tardisks/vendor:1:9: error: Failed to fetch domain id for appDm [unknown-domain]",
          "tardisks/vendor:2:1: error: invalid tardisk policy rule type (-x) "
          "[unknown-rule-type]"));
  EXPECT_EQ(Findings()[2].loadMessage, "Error in parsing policy for domain: " + kDir +
                                           "vendor: 1 : Failed to fetch domain id for appDm");
}

TEST_F(TardiskLinesTest, HostsOwnPolicyIsNamedByItsPathInTheHost) {
  for (const char* name : {"appDom", "globalVMDom", "ioFilterDom"}) {
    base_.File(std::string("etc/olvane/secpolicy/domains/") + name, "-s open grnt\n");
  }
  base_.Directory("etc/olvane/secpolicy/objects").Directory("etc/olvane/secpolicy/fileLabels");
  MakeHostWith("-E default appDom\n");
  const Result result = Command({"check", "--host", Host()});
  EXPECT_EQ(result.status, 1);
  EXPECT_THAT(result.out, testing::StartsWith("/etc/olvane/secpolicy/domains/appDom:1:9: error: "
                                              "invalid keyword grnt [bad-decision]\n"));
  EXPECT_EQ(result.err, "3 errors, 0 warnings in 4 files\n");
}

}  // namespace
}  // namespace SecPolicyTool
