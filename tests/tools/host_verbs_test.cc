// Making, assembling and inspecting hosts.
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>

#include "host/files/unique_fd.h"
#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

namespace fs = std::filesystem;
using StandIn::Archive;
using testing::HasSubstr;
using testing::StartsWith;

using HostVerbsTest = CommandTest;

constexpr char kLimits[] =
    "Limits: 1024 domains, 65536 labels of each type, 1048576 file rules a domain\n";

TEST_F(HostVerbsTest, InitMakesAHostAndSaysHowToGoOn) {
  const Result result = Done({"host", "init", Host()});
  EXPECT_EQ(result.err, "Made the host directory " + Host() + ". Put its tardisks into " + Host() +
                            "/tardisks, then run: secpolicy host assemble " + Host() + "\n");
  EXPECT_EQ(result.out, "");
  EXPECT_TRUE(fs::is_directory(Host() + "/tardisks"));
  EXPECT_TRUE(fs::is_regular_file(Host() + "/host.json"));
}

TEST_F(HostVerbsTest, InitLeavesAHostAlone) {
  Done({"host", "init", Host()});
  StandIn::WriteBytes(Host() + "/host.json", "mine");
  const Result result = Command({"host", "init", Host()});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.err, "Error: " + Host() + " is a host directory already\n");
  EXPECT_EQ(StandIn::ReadBytes(Host() + "/host.json"), "mine");
}

TEST_F(HostVerbsTest, AssembleReportsItsArchives) {
  Done({"host", "init", Host()});
  StandIn::WriteBytes(Host() + "/tardisks/base.tar",
                      Archive().Directory("etc").File("etc/motd", "hello\n").Bytes());
  StandIn::WriteBytes(Host() + "/tardisks/net.tar", Archive().File("net", "").Bytes());
  const Result result = Done({"host", "assemble", Host()});
  EXPECT_EQ(result.out, "base.tar: 2 entries\nnet.tar: 1 entries\n2 tardisks, 3 entries\n");
  EXPECT_EQ(result.err, "");
  EXPECT_EQ(StandIn::ReadBytes(Host() + "/root/etc/motd"), "hello\n");
}

TEST_F(HostVerbsTest, AssembleStartsTheKernelAnew) {
  MakeHost();
  ASSERT_EQ(Load().status, 0);
  ASSERT_THAT(Shown(), HasSubstr("appDom"));
  Done({"host", "assemble", Host()});
  EXPECT_THAT(Shown(), testing::Not(HasSubstr("appDom")));
}

TEST_F(HostVerbsTest, ArchiveThatIsNoneIsRefusedAndTheHostStays) {
  MakeHost({{"base.tar", Archive().File("motd", "old\n")}});
  StandIn::WriteBytes(Host() + "/tardisks/bad.tar", "this is no archive");
  const Result result = Command({"host", "assemble", Host()});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.out, "");
  EXPECT_THAT(result.err, StartsWith("Error: " + Host() + "/tardisks/bad.tar: "));
  EXPECT_EQ(StandIn::ReadBytes(Host() + "/root/motd"), "old\n");
}

// A lock of the host that this process holds.
class HeldLock {
 public:
  explicit HeldLock(const std::string& host)
      : fd_(::open((host + "/kernel.lock").c_str(), O_RDWR | O_CLOEXEC)) {
    struct flock range {};
    range.l_type = F_WRLCK;
    EXPECT_EQ(::fcntl(fd_.Get(), F_SETLK, &range), 0);
  }

 private:
  StandIn::UniqueFd fd_;
};

TEST_F(HostVerbsTest, VerbsThatChangeAHostWaitAsLongAsAskedAndNameTheHolder) {
  MakeHost();
  const HeldLock lock(Host());
  const std::string error =
      Host() + "/kernel.lock: is locked by process " + std::to_string(::getpid()) +
      ", which kept it for the 0 seconds of waiting; \"--wait SECONDS\" waits "
      "longer\n";
  const std::vector<Arguments> changes = {
      {"host", "assemble", "--wait", "0", Host()},
      {"load", "--host", Host(), "--wait", "0", PolicyDir()},
      {"label", "set", "--host", Host(), "--wait", "0", "/tardisks", "tardisk"},
      {"domain", "create", "--host", Host(), "--wait", "0", "newDom"},
      {"domain", "destroy", "--host", Host(), "--wait", "0", "0"},
      {"files", "add", "--host", Host(), "--wait", "0", "0", "/a", "r"},
      {"files", "update", "--host", Host(), "--wait", "0", "0", "/a", "r"},
      {"files", "remove", "--host", Host(), "--wait", "0", "0", "/a"},
      {"files", "rename", "--host", Host(), "--wait", "0", "/a", "/b"}};
  for (const Arguments& change : changes) {
    const Result result = Command(change);
    EXPECT_EQ(result.status, 1) << change[0] << " " << change[1];
    EXPECT_THAT(result.err, HasSubstr(error)) << change[0] << " " << change[1];
  }
}

TEST_F(HostVerbsTest, VerbsThatReadAHostNeedNoLock) {
  MakeHost();
  const HeldLock lock(Host());
  for (const Arguments& question :
       {Arguments{"host", "info", Host()}, Arguments{"show", "--host", Host()},
        Arguments{"digest", "--host", Host(), "kernel"},
        Arguments{"domain", "list", "--host", Host()},
        Arguments{"label", "get", "--host", Host(), "/tardisks"}}) {
    EXPECT_EQ(Command(question).status, 0) << question[0] << " " << question[1];
  }
}

TEST_F(HostVerbsTest, AFifoInPlaceOfTheLockHoldsNobodyUp) {
  MakeHost();
  fs::remove(Host() + "/kernel.lock");
  ASSERT_EQ(::mkfifo((Host() + "/kernel.lock").c_str(), 0600), 0);
  const Result result = Command({"host", "assemble", Host()});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.err, "Error: " + Host() + "/kernel.lock: not a regular file\n");
  Done({"host", "info", Host()});
}

TEST_F(HostVerbsTest, RootWorksWhereOthersWriteOnlyWhenToldSo) {
  if (::getuid() != 0) GTEST_SKIP() << "another user is not held back";
  MakeHost();
  ASSERT_EQ(::chmod(Host().c_str(), 0777), 0);
  const std::string error = "Error: " + Host() +
                            ": users other than root can write to this directory; with "
                            "\"--trust-other-writers\" root works in it all the same\n";
  EXPECT_EQ(Command({"host", "assemble", Host()}).err, error);
  EXPECT_THAT(Command({"load", "--host", Host(), PolicyDir()}).err, HasSubstr(error));
  EXPECT_EQ(Command({"domain", "create", "--host", Host(), "newDom"}).err, error);
  Done({"host", "assemble", "--trust-other-writers", Host()});
  Done({"domain", "create", "--host", Host(), "--trust-other-writers", "newDom"});
}

TEST_F(HostVerbsTest, TheWaitIsANumberOfSeconds) {
  for (const char* wait : {"-1", "x", "1.5", "86401"}) {
    EXPECT_EQ(Command({"host", "assemble", "--wait", wait, Host()}).status, 2) << wait;
  }
}

TEST_F(HostVerbsTest, MissingHostIsNamedAndHowToMakeIt) {
  const std::string error = "Error: " + Host() +
                            ": cannot be opened: No such file or directory; make one with "
                            "\"secpolicy host init " +
                            Host() + "\"\n";
  for (const Arguments& arguments :
       {Arguments{"host", "assemble", Host()}, Arguments{"host", "info", Host()},
        Arguments{"show", "--host", Host()}, Arguments{"load", "--host", Host()}}) {
    const Result result = Command(arguments);
    EXPECT_EQ(result.status, 1) << arguments[0];
    EXPECT_EQ(result.err, error) << arguments[0];
  }
}

TEST_F(HostVerbsTest, HostThatHasNotBeenAssembledSaysSo) {
  Done({"host", "init", Host()});
  for (const char* verb : {"load", "show"}) {
    const Result result = Command({verb, "--host", Host()});
    EXPECT_EQ(result.status, 1) << verb;
    EXPECT_EQ(result.err, "Error: " + Host() +
                              " has not been assembled; do it with \"secpolicy host assemble " +
                              Host() + "\"\n")
        << verb;
  }
}

TEST_F(HostVerbsTest, InfoOfANewHost) {
  Done({"host", "init", Host()});
  EXPECT_EQ(Done({"host", "info", Host()}).out, "Host: " + Host() + "\n" + kLimits +
                                                    "Image: not assembled\nObjects: 2\nDomains:\n"
                                                    "  0 rootDom: no rules\n");
}

TEST_F(HostVerbsTest, InfoOfALoadedHost) {
  MakeHost({{"base.tar", Archive().Directory("etc").File("etc/motd", "hello\n")}});
  Policy("objects/base", "conf\n");
  Policy("domains/appDom", "-s open grant\n-s read grant\n-a conf read grant\n-r /etc r\n");
  ASSERT_EQ(Load().status, 0);
  EXPECT_EQ(Done({"host", "info", Host()}).out,
            "Host: " + Host() + "\n" + kLimits +
                "Image: 1 tardisks\n  base.tar: 2 paths\nObjects: 3\nDomains:\n"
                "  0 rootDom: -d 1\n  1 appDom: -a 1 -r 1 -s 2\n"
                "  2 globalVMDom: no rules\n  3 ioFilterDom: no rules\n");
}

TEST_F(HostVerbsTest, DamagedHostIsNamed) {
  MakeHost();
  StandIn::WriteBytes(Host() + "/kernel.json", "{");
  for (const Arguments& arguments :
       {Arguments{"host", "info", Host()}, Arguments{"show", "--host", Host()},
        Arguments{"load", "--host", Host()}}) {
    const Result result = Command(arguments);
    EXPECT_EQ(result.status, 1) << arguments[0];
    EXPECT_THAT(result.err, StartsWith("Error: " + Host() + "/kernel.json:1:2: ")) << arguments[0];
  }
}

}  // namespace
}  // namespace SecPolicyTool
