// What is odd about entries of the policy directory, and about files as such.
#include "tools/check/policy_directory.h"

#include <sys/stat.h>

#include <filesystem>

#include "tests/tools/check/check_fixture.h"

namespace SecPolicyTool {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

namespace fs = std::filesystem;

class PolicyDirectoryTest : public CheckTest {};

TEST(BackupNames, AreThoseOfEditorsAndPackageManagers) {
  for (const char* name : {"x~", ".x.swp", ".x.swo", "x.bak", "x.orig", "x.rej", "#x#", ".#x",
                           "x.dpkg-old", "x.dpkg-dist", "x.rpmsave", "x.rpmnew", "x.tmp"}) {
    EXPECT_TRUE(IsBackupName(name)) << name;
  }
  for (const char* name : {"x", "netDom", "swp", "x.d", "a#b", "#x", "bakDom", "~x"}) {
    EXPECT_FALSE(IsBackupName(name)) << name;
  }
}

TEST_F(PolicyDirectoryTest, BackupsAreSaidOnce) {
  Policy("domains/netDom~", "");
  Policy("objects/.base.swp", "");
  Policy("fileLabels/base.orig", "");
  const std::string text =
      ": warning: the name is that of a copy that was left behind, and a load reads the file "
      "[backup-file]";
  EXPECT_THAT(Found(), ElementsAre("domains/netDom~" + text, "fileLabels/base.orig" + text,
                                   "objects/.base.swp" + text));
}

TEST_F(PolicyDirectoryTest, EntriesThatAreNoFilesArePassedOver) {
  fs::create_symlink("netDom", PolicyDir() + "/domains/link");
  fs::create_directory(PolicyDir() + "/domains/sub");
  EXPECT_THAT(
      Found(),
      ElementsAre(
          "domains/link: warning: a symbolic link, which a load passes over [skipped-entry]",
          "domains/sub: warning: a directory, which a load passes over [skipped-entry]"));
}

TEST_F(PolicyDirectoryTest, PipesArePassedOver) {
  ASSERT_EQ(mkfifo((PolicyDir() + "/objects/pipe").c_str(), 0600), 0);
  EXPECT_THAT(Found(),
              ElementsAre("objects/pipe: warning: no regular file, which a load passes over "
                          "[skipped-entry]"));
}

TEST_F(PolicyDirectoryTest, MisspeltSubDirectoryIsNamed) {
  fs::rename(PolicyDir() + "/fileLabels", PolicyDir() + "/filelabels");
  Policy("README", "about\n");
  Policy(".hidden", "\n");
  EXPECT_THAT(
      Found(),
      ElementsAre("README: warning: a load reads nothing of this name [skipped-entry]",
                  "fileLabels: error: the directory cannot be opened [unreadable]",
                  "filelabels: warning: a load reads nothing of this name [skipped-entry]"));
  const auto findings = Findings();
  EXPECT_EQ(findings[0].help, "what is read is objects, domains and fileLabels");
  EXPECT_EQ(findings[1].loadMessage,
            "Unable to open policy directory " + PolicyDir() + "/fileLabels");
  EXPECT_EQ(LoadErrorsOf().at(0), findings[1].loadMessage);
  EXPECT_EQ(findings[2].help, "did you mean \"fileLabels\"?");
}

TEST_F(PolicyDirectoryTest, MissingDirectoryOfDomainsIsSaidWithWhatFollows) {
  fs::remove_all(PolicyDir() + "/domains");
  std::vector<std::string> ids;
  for (const Finding& finding : Findings()) ids.push_back(finding.id);
  EXPECT_THAT(ids, ElementsAre("unreadable", "missing-domain", "missing-domain", "missing-domain"));
}

TEST_F(PolicyDirectoryTest, TardiskDirectoryThatIsAFile) {
  Policy("fileLabels/base", "");
  fs::create_directories(Host() + "/root/etc/olvane/secpolicy");
  StandIn::WriteBytes(Host() + "/root/etc/olvane/secpolicy/tardisks", "");
  const auto findings = Findings();
  ASSERT_EQ(findings.size(), 1U);
  EXPECT_EQ(findings[0].id, "unreadable");
  EXPECT_EQ(LoadErrorsOf().at(0), findings[0].loadMessage);
}

TEST_F(PolicyDirectoryTest, LongLinesAndWhatTheyHide) {
  Policy("domains/appDom", "-s open grant #" + std::string(1010, '-') + "\n-x\n-y\n");
  Policy("domains/netDom", "-a conf read grant" + std::string(1005, ' '));
  Policy("domains/ioFilterDom", "-s open grant" + std::string(1020, ' ') + "\n-s close grant");
  const std::string start = " bytes, of which a load reads 1023; ignored are the last ";
  EXPECT_THAT(Found(), ElementsAre("domains/appDom:1:1024: warning: the line has 1025" + start +
                                       "2 bytes and 2 lines below [long-line]",
                                   "domains/ioFilterDom:1:1024: warning: the line has 1033" +
                                       start + "10 bytes and 1 line below [long-line]"));
}

TEST_F(PolicyDirectoryTest, BytesThatAreNotSeen) {
  using namespace std::string_literals;
  Policy("domains/appDom",
         "-s open grant # a\tcomment\r\n"
         "-s open revoke\0 # hidden\n"s
         "# \0 in a comment\n"s);
  Policy("objects/base", "conf\r\nprogram\tx\nconf\nprogram\n");
  EXPECT_THAT(
      Found(),
      ElementsAre(
          "domains/appDom:2:9: warning: the line revokes what the one on line 1 grants; the later "
          "one wins [contradictory-rule]",
          "domains/appDom:2:15: warning: a NUL byte ends the line; what follows it is ignored "
          "[nul-byte]",
          "objects/base:1:1: warning: no rule and no file label refers to the object \"conf\r\" "
          "[unused-object]",
          "objects/base:1:5: warning: a carriage return is part of the word [carriage-return]",
          "objects/base:2:1: warning: no rule and no file label refers to the object "
          "\"program\tx\" [unused-object]",
          "objects/base:2:8: warning: a tab separates no words: it is part of the word [tab]"));
}

TEST_F(PolicyDirectoryTest, UnreachableAndEmptyDomains) {
  Policy("domains/emptyDom", "# nothing\n");
  Policy("domains/islandDom", "-d program farDom exec grant\n-d program islandDom fork grant\n");
  Policy("domains/farDom", "-d program islandDom exec grant\n");
  Policy("domains/goneDom", "-s open grant\n");
  Policy(
      "domains/netDom",
      "-d conf goneDom exec grant\n-d conf goneDom exec revoke\n-d program nextDom exec grant\n");
  Policy("domains/nextDom", "-d program mendedDom exec grnt\n");
  Policy("domains/mendedDom", "-s open grant\n");
  const std::string unreachable =
      ": warning: no granted transition leads here from a domain in which programs run "
      "[unreachable-domain]";
  const auto found = Found();
  EXPECT_THAT(found, ElementsAre("domains/emptyDom: warning: the domain has no rules "
                                 "[empty-domain]",
                                 "domains/emptyDom" + unreachable, "domains/farDom" + unreachable,
                                 "domains/goneDom" + unreachable, "domains/islandDom" + unreachable,
                                 "domains/netDom:2:22: warning: the line revokes what the one on "
                                 "line 1 grants; the later one wins [contradictory-rule]",
                                 "domains/nextDom:1:27: error: invalid keyword grnt "
                                 "[bad-decision]"));
}

TEST_F(PolicyDirectoryTest, DomainInWhichAWorldRunsIsReached) {
  StandIn::WriteBytes(Host() + "/host.json",
                      R"({"format": 1, "worlds": [{"id": 4711, "domain": "guestDom"}]})");
  Policy("domains/guestDom", "-s open grant\n");
  EXPECT_THAT(Found(), IsEmpty());
}

}  // namespace
}  // namespace SecPolicyTool
