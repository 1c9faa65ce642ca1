// Policies as they are read from directories and from a host's kernel.
#include "tools/policy/policy_source.h"

#include <filesystem>

#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

using StandIn::Archive;
using StandIn::HostDirectory;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;
using testing::UnorderedElementsAre;

class PolicySourceTest : public CommandTest {
 protected:
  PolicySourceTest() { Policy("objects/base", "# the names\nconf  # one\n\nvendorApp\n"); }

  void MakeHost() const {
    Archive base;
    base.Directory("etc").File("etc/motd", "hello").File("etc/hosts", "").Directory("usr/bin");
    base.Symlink("bin", "usr/bin").File("usr/bin/ls", "");
    Archive vendor;
    vendor.File("etc/olvane/secpolicy/tardisks/vendor", "# vendor\n-E vendorApp appDom\n");
    CommandTest::MakeHost({{"base.tar", base}, {"vendor.tar", vendor}});
  }

  SourcePolicy Read(const std::string& source) const {
    return ReadSource(HostDirectory(Host()), source);
  }
  SourcePolicy Read() const { return Read(PolicyDir()); }

  // The domain's rules with their places, the directory left out.
  [[nodiscard]] std::vector<std::string> Rules(const SourcePolicy& source,
                                               const std::string& domain) const {
    std::vector<std::string> lines;
    for (const PolicyRule& rule : source.policy.domains.at(domain).rules) {
      lines.push_back(LineOf(rule) + " @ " + ShownHere(rule.place));
    }
    return lines;
  }

  [[nodiscard]] std::string ShownHere(const std::optional<Place>& place) const {
    std::string shown = PlaceText(place);
    const std::string dir = PolicyDir() + "/";
    return shown.starts_with(dir) ? shown.substr(dir.size()) : shown;
  }
};

TEST_F(PolicySourceTest, RulesHaveThePlacesThatDecidedThem) {
  MakeHost();
  Policy("domains/appDom",
         "-s open grant\n"
         "  -a conf read grant # x\n"
         "-s open revoke\n"
         "-r /bin/ls r\n"
         "-r /bin/ls xr\n"
         "-r /nowhere\n");
  const SourcePolicy source = Read();
  EXPECT_THAT(source.errors, IsEmpty());
  EXPECT_THAT(Rules(source, "appDom"), ElementsAre("-a conf read grant @ domains/appDom:2:3",
                                                   "-r /usr/bin/ls rx @ domains/appDom:5:1",
                                                   "-r /nowhere @ domains/appDom:6:1",
                                                   "-s open revoke @ domains/appDom:3:1"));
}

TEST_F(PolicySourceTest, TardiskRulesStandInTheTardisksFile) {
  MakeHost();
  Policy("domains/rootDom", "# none\n-s open grant\n");
  const SourcePolicy source = Read();
  EXPECT_THAT(
      Rules(source, "rootDom"),
      ElementsAre("-d vendorApp appDom exec grant @ /etc/olvane/secpolicy/tardisks/vendor:2:1",
                  "-d tardisk appDom exec grant @ -", "-s open grant @ domains/rootDom:2:1"));
  const auto& tardisks = source.policy.tardisks;
  ASSERT_EQ(tardisks.size(), 2U);
  EXPECT_EQ(tardisks.at("base.tar").label, "tardisk");
  EXPECT_EQ(tardisks.at("base.tar").place, std::nullopt);
  EXPECT_EQ(tardisks.at("vendor.tar").label, "vendorApp");
  EXPECT_EQ(PlaceText(tardisks.at("vendor.tar").place),
            "/etc/olvane/secpolicy/tardisks/vendor:2:1");
}

TEST_F(PolicySourceTest, ObjectsStandWhereTheyAreNamedFirst) {
  MakeHost();
  Policy("objects/more", "conf\n");
  const SourcePolicy source = Read();
  std::map<std::string, std::string> places;
  for (const auto& [name, object] : source.policy.objects) {
    places[name] = object.isPredefined ? "predefined" : ShownHere(object.place);
  }
  EXPECT_THAT(places,
              ElementsAre(Pair("conf", "objects/base:2:1"), Pair("default", "predefined"),
                          Pair("tardisk", "predefined"), Pair("vendorApp", "objects/base:4:1")));
}

TEST_F(PolicySourceTest, FilesHaveTheLineThatLabelledThemLast) {
  MakeHost();
  Policy("fileLabels/a", "/etc/* conf\n/bin vendorApp\n");
  Policy("fileLabels/b", "/etc/motd vendorApp\n");
  const SourcePolicy source = Read();
  std::map<std::string, std::string> files;
  for (const auto& [path, file] : source.policy.files) {
    if (!path.starts_with("/etc/olvane")) {
      files[path] = file.label + " @ " + ShownHere(file.place);
    }
  }
  EXPECT_THAT(files, UnorderedElementsAre(Pair("/etc", "conf @ fileLabels/a:1:1"),
                                          Pair("/etc/hosts", "conf @ fileLabels/a:1:1"),
                                          Pair("/etc/motd", "vendorApp @ fileLabels/b:1:1"),
                                          Pair("/usr/bin", "vendorApp @ fileLabels/a:2:1")));
}

TEST_F(PolicySourceTest, PlacesNameFilesAsTheUserDoes) {
  MakeHost();
  const std::filesystem::path before = std::filesystem::current_path();
  std::filesystem::current_path(Path(""));
  const SourcePolicy source = Read("policy");
  std::filesystem::current_path(before);
  EXPECT_EQ(PlaceText(source.policy.domains.at("appDom").place), "policy/domains/appDom");
}

TEST_F(PolicySourceTest, SlashesAtTheEndOfADirectoryAreNotShown) {
  MakeHost();
  const SourcePolicy source = Read(PolicyDir() + "//");
  EXPECT_EQ(PlaceText(source.policy.domains.at("appDom").place), PolicyDir() + "/domains/appDom");
}

TEST_F(PolicySourceTest, ErrorsAreThoseOfALoad) {
  MakeHost();
  Policy("domains/appDom", "-s open grant\n-s opne grant\n-s close grant\n");
  const SourcePolicy source = Read();
  EXPECT_THAT(
      source.errors,
      ElementsAre("Error in parsing policy for domain: appDom: 2 : unknown system call "
                  "\"opne\" (nearest: open)",
                  "Error in parsing the policy for some domains", "Failure in domain policy",
                  "There were some problems encountered in setting the policy"));
  EXPECT_THAT(Rules(source, "appDom"), ElementsAre("-s open grant @ domains/appDom:1:1"));
  EXPECT_FALSE(source.isTerminated);
}

TEST_F(PolicySourceTest, TerminatedLoadMeansWhatItHadInstalled) {
  MakeHost();
  std::filesystem::remove(PolicyDir() + "/domains/appDom");
  Policy("domains/utilDom", "-s open grant\n");
  const SourcePolicy source = Read();
  EXPECT_TRUE(source.isTerminated);
  EXPECT_THAT(source.errors, ElementsAre("Failed to fetch domainID for default tar disk domain"));
  EXPECT_THAT(Rules(source, "utilDom"), ElementsAre("-s open grant @ domains/utilDom:1:1"));
}

TEST_F(PolicySourceTest, TrialLeavesTheHostAsItWas) {
  MakeHost();
  const SourcePolicy before = Read("kernel");
  EXPECT_THAT(before.policy.domains, ElementsAre(Pair("rootDom", testing::_)));
  Read();
  EXPECT_THAT(Read("kernel").policy.domains, ElementsAre(Pair("rootDom", testing::_)));
}

TEST_F(PolicySourceTest, KernelHoldsWhatWasLoaded) {
  MakeHost();
  Policy("domains/appDom", "-s open grant\n-r /etc/motd r\n");
  Policy("fileLabels/a", "/etc/motd conf\n");
  ASSERT_EQ(Load().status, 0);
  const SourcePolicy source = Read("kernel");
  EXPECT_THAT(Rules(source, "appDom"), ElementsAre("-r /etc/motd r @ -", "-s open grant @ line 1"));
  EXPECT_EQ(source.policy.files.at("/etc/motd").label, "conf");
  EXPECT_EQ(source.policy.objects.size(), 4U);
}

TEST_F(PolicySourceTest, LabelWithoutANameIsEmpty) {
  MakeHost();
  Policy("fileLabels/a", "/etc/motd conf\n");
  ASSERT_EQ(Load().status, 0);
  Policy("objects/base", "vendorApp\n");
  Policy("fileLabels/a", "");
  ASSERT_EQ(Load().status, 0);
  EXPECT_EQ(Read("kernel").policy.files.at("/etc/motd").label, "");
}

TEST_F(PolicySourceTest, MissingDirectoryIsSaid) {
  MakeHost();
  try {
    Read(Path("none"));
    ADD_FAILURE() << "was read";
  } catch (const std::runtime_error& failure) {
    EXPECT_EQ(failure.what(), "there is no policy directory " + Path("none"));
  }
}

TEST_F(PolicySourceTest, HostWithoutARootIsSaid) {
  Done({"host", "init", Host()});
  try {
    Read();
    ADD_FAILURE() << "was read";
  } catch (const std::runtime_error& failure) {
    EXPECT_THAT(failure.what(), testing::HasSubstr("has not been assembled"));
  }
}

TEST_F(PolicySourceTest, BytesThatAreNotTextAreKept) {
  MakeHost();
  Policy("domains/a\xFF", "-r /\xFE r\n");
  const SourcePolicy source = Read();
  EXPECT_EQ(LineOf(source.policy.domains.at("a\xFF").rules.at(0)), "-r /\xFE r");
}

}  // namespace
}  // namespace SecPolicyTool
