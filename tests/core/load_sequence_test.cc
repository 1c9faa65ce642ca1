// The order of a load, where each stage's policy comes from, and the interface that it uses.
#include "tests/core/load_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;

class LoadPolicyTest : public LoadTest {
 protected:
  static constexpr char kSystemDir[] = "etc/olvane/secpolicy/";

  // The policy of LoadTest, or a part of it, as files of the host itself.
  void PolicyOfHost(const std::string& dir) {
    StandIn::Archive& archive = Tardisk("policy.tgz");
    archive.File(dir + "objects/main", "apps\n").File(dir + "fileLabels/main", "/bin/tool apps\n");
    archive.File(dir + "domains/appDom", "-s read grant\n");
    archive.File(dir + "domains/globalVMDom", "").File(dir + "domains/ioFilterDom", "");
  }

  Outcome LoadFrom(const std::string& dir) {
    return Run([&] { SecPolicy::LoadPolicy(dir); });
  }
};

TEST_F(LoadPolicyTest, RunsTheStagesInTheirFixedOrder) {
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(
      outcome.Infos(),
      ElementsAre("Using policy dir " + PolicyDir(), "Parsed all objects",
                  "Objects defined and obsolete objects removed", "Parsed all domain names",
                  "Domain policies parsed and syntax validated",
                  "Constraints check for domain policies succeeded", "Domain policies set",
                  "Skipping tardisk policy as /etc/olvane/secpolicy/tardisks does not exist",
                  "Parsed all the tardisk policy files", "Set all the tardisk labels and policy",
                  "Parsed all file label mappings", "Set all file labels",
                  "System security policy has been set successfully"));
  EXPECT_THAT(outcome.Errors(), IsEmpty());
}

TEST_F(LoadPolicyTest, InstallsEachStageBeforeTheNextBegins) {
  const Outcome outcome = Load();
  EXPECT_THAT(Installed(outcome), ElementsAre(kObjectsSet, kDomainsSet, kGlobalVMSet, kIoFilterSet,
                                              kTardisksSet, kFileLabelsSet));
}

TEST_F(LoadPolicyTest, LooksTheWellKnownDomainsUpAfterTheDomainsAreSet) {
  const Outcome outcome = Load();
  EXPECT_THAT(
      outcome.Operations({"create-domain", "find-domain", "set-rule", "set-global-vm-domain",
                          "set-io-filter-domain"}),
      ElementsAre("find-domain appDom", "create-domain appDom policy", "find-domain globalVMDom",
                  "create-domain globalVMDom policy", "find-domain ioFilterDom",
                  "create-domain ioFilterDom policy", kDomainsSet, "find-domain globalVMDom",
                  kGlobalVMSet, "find-domain ioFilterDom", kIoFilterSet, "find-domain appDom",
                  "find-domain rootDom", kTardisksSet));
}

TEST_F(LoadPolicyTest, PrintsNothing) {
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.out, "");
  EXPECT_EQ(outcome.err, "");
}

TEST_F(LoadPolicyTest, OpensOneInterfaceAndClosesItAtTheEnd) {
  const Outcome outcome = Load();
  ExpectClosedInterface(outcome);
  EXPECT_EQ(outcome.events[1], "info: Using policy dir " + PolicyDir());
}

TEST_F(LoadPolicyTest, EachLoadOpensAnInterfaceOfItsOwn) {
  const Outcome outcome = Run([&] {
    SecPolicy::LoadPolicy(PolicyDir());
    SecPolicy::LoadPolicy(PolicyDir());
  });
  EXPECT_THAT(
      outcome.Operations({"open-interface", "close-interface"}),
      ElementsAre("open-interface", "close-interface", "open-interface", "close-interface"));
}

TEST_F(LoadPolicyTest, LeavesNoDescriptorOpen) {
  const Outcome outcome = Run([&] {
    const int before = LowestFreeDescriptor();
    SecPolicy::LoadPolicy(PolicyDir());
    return static_cast<unsigned int>(LowestFreeDescriptor() - before);
  });
  EXPECT_EQ(outcome.value, "0");
}

TEST_F(LoadPolicyTest, TrailingSlashOfTheDirectoryIsKept) {
  Load();
  Remove("objects");
  const Outcome outcome = LoadFrom(PolicyDir() + "/");
  EXPECT_EQ(outcome.Infos().front(), "Using policy dir " + PolicyDir() + "/");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Unable to open policy directory " + PolicyDir() + "//objects"));
  EXPECT_EQ(Installed(outcome), AllBut({kObjectsSet}));
}

TEST_F(LoadPolicyTest, EmptyDirectoryNameMeansTheDirectoriesAtTheRoot) {
  PolicyOfHost("");
  const Outcome outcome = LoadFrom("");
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.Infos().front(), "Using policy dir ");
  EXPECT_EQ(Installed(outcome), AllBut({}));
}

TEST_F(LoadPolicyTest, EmptyDirectoryNameIsNotReplacedByTheSystemDirectory) {
  PolicyOfHost(kSystemDir);
  const Outcome outcome = LoadFrom("");
  EXPECT_EQ(outcome.signal, SIGABRT);
  EXPECT_THAT(outcome.Errors(), ElementsAre("Unable to open policy directory /objects",
                                            "Unable to open policy directory /domains",
                                            "Failed to fetch domainID for global VM Domain"));
}

TEST_F(LoadPolicyTest, EmptyDirectoryNameNamesAllThreeDirectories) {
  Load();
  const Outcome outcome = LoadFrom("");
  EXPECT_THAT(outcome.Errors(), ElementsAre("Unable to open policy directory /objects",
                                            "Unable to open policy directory /domains",
                                            "Unable to open policy directory /fileLabels"));
}

TEST_F(LoadPolicyTest, SystemDirectoryIsADirectoryLikeAnyOther) {
  PolicyOfHost(kSystemDir);
  const Outcome outcome = LoadFrom("/etc/olvane/secpolicy");
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(Installed(outcome), AllBut({}));
}

TEST_F(LoadPolicyTest, TardiskPolicyComesFromTheSystemDirectory) {
  Tardisk("base.tgz").File(std::string(kSystemDir) + "tardisks/base", "-E apps appDom\n");
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(Installed(outcome), Contains("set-file-label /tardisks/base.tgz apps"));
}

TEST_F(LoadPolicyTest, TardisksBelowTheNamedDirectoryAreNotRead) {
  Policy("tardisks/base", "not a tardisk policy\n");
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Operations({"backing-tardisk"}), IsEmpty());
}

TEST_F(LoadPolicyTest, OtherPolicyOfTheSystemDirectoryIsNotRead) {
  Tardisk("policy.tgz")
      .File(std::string(kSystemDir) + "objects/main", "systemObject\n")
      .File(std::string(kSystemDir) + "domains/systemDom", "")
      .File(std::string(kSystemDir) + "fileLabels/main", "/bin/tool systemObject\n");
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(Installed(outcome), AllBut({}));
  EXPECT_THAT(outcome.Operations(), Not(Contains("find-domain systemDom")));
}

TEST_F(LoadPolicyTest, EmptySubdirectoriesAreAPolicyOnceTheDomainsExist) {
  Load();
  for (const char* file : {"objects/main", "domains/appDom", "domains/globalVMDom",
                           "domains/ioFilterDom", "fileLabels/main"}) {
    Remove(file);
  }
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(Installed(outcome), ElementsAre(kGlobalVMSet, kIoFilterSet, kTardisksSet));
}

TEST_F(LoadPolicyTest, SecondLoadInstallsThePolicyAgain) {
  Load();
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(Installed(outcome), AllBut({}));
  EXPECT_THAT(outcome.Operations({"create-domain"}), IsEmpty());
}

}  // namespace
}  // namespace SecPolicyTest
