// Loading a policy, and what later processes find of it.
#include <sys/resource.h>

#include <csignal>
#include <filesystem>
#include <future>

#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

using StandIn::Archive;
using testing::AllOf;
using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

class LoadTest : public CommandTest {
 protected:
  LoadTest() {
    Policy("objects/base", "conf\n");
    Policy("domains/appDom", "-s open grant\n-a conf read grant\n-r / rw\n");
  }
};

TEST_F(LoadTest, ProgressGoesToStandardError) {
  MakeHost();
  const Result result = Load();
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.out, "");
  EXPECT_THAT(
      result.Errors(),
      ElementsAre("Using policy dir " + PolicyDir(), "Parsed all objects",
                  "Objects defined and obsolete objects removed", "Parsed all domain names",
                  "Domain policies parsed and syntax validated",
                  "Constraints check for domain policies succeeded", "Domain policies set",
                  "Skipping tardisk policy as /etc/olvane/secpolicy/tardisks does not exist",
                  "Parsed all the tardisk policy files", "Set all the tardisk labels and policy",
                  "Parsed all file label mappings", "Set all file labels",
                  "System security policy has been set successfully"));
}

TEST_F(LoadTest, LaterProcessShowsWhatWasLoaded) {
  MakeHost();
  ASSERT_EQ(Load().status, 0);
  EXPECT_THAT(Shown(), AllOf(HasSubstr("Domain Name: appDom Domain ID :1 "),
                             HasSubstr("\n-a conf read grant\n"), HasSubstr("\n-s open grant\n"),
                             HasSubstr("\n-r / rw\n"), HasSubstr("\nconf (3)\n")));
}

TEST_F(LoadTest, LaterLoadReplacesWhatItDecidesAnew) {
  MakeHost();
  ASSERT_EQ(Load().status, 0);
  Policy("domains/appDom", "-s open revoke\n");
  ASSERT_EQ(Load().status, 0);
  EXPECT_THAT(Shown(), AllOf(HasSubstr("\n-s open revoke\n"), Not(HasSubstr("-s open grant"))));
}

TEST_F(LoadTest, WithoutADirectoryTheHostsOwnPolicyIsLoaded) {
  Archive base;
  for (const char* domain : {"appDom", "globalVMDom", "ioFilterDom"}) {
    base.File(std::string("etc/olvane/secpolicy/domains/") + domain, "-s read grant\n");
  }
  base.File("etc/olvane/secpolicy/objects/base", "conf\n")
      .File("etc/olvane/secpolicy/fileLabels/base", "/motd conf\n")
      .File("motd", "hello\n");
  MakeHost({{"base.tar", base}});
  const Result result = Command({"load", "--host", Host()});
  EXPECT_EQ(result.status, 0) << result.err;
  EXPECT_THAT(result.err, StartsWith("Using policy dir /etc/olvane/secpolicy\n"));
  EXPECT_THAT(Shown(), AllOf(HasSubstr("\n-s read grant\n"), HasSubstr("\nconf (3)\n")));
}

TEST_F(LoadTest, ProblemsEndWith1AndTheRestIsInstalled) {
  MakeHost();
  Policy("domains/globalVMDom", "-s opne grant\n");
  const Result result = Load();
  EXPECT_EQ(result.status, 1);
  std::vector<std::string> errors = result.Errors();
  EXPECT_THAT(errors, Contains("Parsed all file label mappings"));
  std::erase_if(errors, [](const std::string& line) { return !line.starts_with("Error: "); });
  EXPECT_THAT(errors, ElementsAre("Error: Error in parsing policy for domain: globalVMDom: 1 : "
                                  "unknown system call \"opne\" (nearest: open)",
                                  "Error: Error in parsing the policy for some domains",
                                  "Error: Failure in domain policy",
                                  "Error: There were some problems encountered in setting the "
                                  "policy"));
  EXPECT_THAT(Shown(), HasSubstr("\n-s open grant\n"));
}

TEST_F(LoadTest, PolicyThatIsNotThereIsAProblem) {
  MakeHost();
  ASSERT_EQ(Load().status, 0);
  const std::string none = Path("none");
  const Result result = Command({"load", "--host", Host(), none});
  EXPECT_EQ(result.status, 1);
  EXPECT_THAT(result.Errors(),
              Contains("Error: Unable to open policy directory " + none + "/objects"));
  EXPECT_THAT(Shown(), HasSubstr("\n-s open grant\n"));
}

TEST_F(LoadTest, TerminatedLoadEndsWith3) {
  MakeHost();
  std::filesystem::remove(PolicyDir() + "/domains/ioFilterDom");
  const Result result = Load();
  EXPECT_EQ(result.status, 3);
  EXPECT_EQ(result.out, "");
  const std::vector<std::string> errors = result.Errors();
  ASSERT_GE(errors.size(), 2u);
  EXPECT_EQ(errors[errors.size() - 2], "Error: Failed to fetch domainID for IOFilter domain");
  EXPECT_EQ(errors.back(),
            "Error: the load was terminated before its end; what it had installed until then is "
            "in " +
                Host() + "/kernel.json");
}

TEST_F(LoadTest, WhatATerminatedLoadInstalledIsShownLater) {
  MakeHost();
  std::filesystem::remove(PolicyDir() + "/domains/globalVMDom");
  ASSERT_EQ(Load().status, 3);
  EXPECT_THAT(Shown(), AllOf(HasSubstr("Domain Name: appDom "), HasSubstr("\n-s open grant\n"),
                             HasSubstr("\nconf (3)\n"), Not(HasSubstr("globalVMDom"))));
  Policy("domains/globalVMDom", "");
  EXPECT_EQ(Load().status, 0);
}

// A state that may not be written: a file may have no byte more.
void ForbidWriting() {
  rlimit size{};
  getrlimit(RLIMIT_FSIZE, &size);
  size.rlim_cur = 0;
  setrlimit(RLIMIT_FSIZE, &size);
}

TEST_F(LoadTest, StateThatCannotBeWrittenFailsTheLoad) {
  MakeHost();
  const std::string refusal = Host() + "/kernel.json: cannot be written: File too large";
  const Result result = Command({"load", "--host", Host(), PolicyDir()}, ForbidWriting);
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.Errors().back(), "Error: " + refusal);
  std::filesystem::remove(PolicyDir() + "/domains/appDom");
  const Result terminated = Command({"load", "--host", Host(), PolicyDir()}, ForbidWriting);
  EXPECT_EQ(terminated.status, 3);
  EXPECT_EQ(terminated.Errors().back(),
            "Error: the load was terminated, and what it had installed is lost: " + refusal);
  EXPECT_FALSE(std::filesystem::exists(Host() + "/kernel.json"));
}

TEST_F(LoadTest, LoadsAtOnceFollowOneAnother) {
  MakeHost();
  const auto load = [&] { return Load().status; };
  std::vector<std::future<int>> loads;
  for (int i = 0; i < 6; ++i) loads.push_back(std::async(std::launch::async, load));
  for (auto& status : loads) EXPECT_EQ(status.get(), 0);
  const std::string shown = Shown();
  EXPECT_THAT(shown, HasSubstr("Domain Name: ioFilterDom Domain ID :3 "));
  EXPECT_EQ(shown.find("-s open grant"), shown.rfind("-s open grant"));
}

}  // namespace
}  // namespace SecPolicyTool
