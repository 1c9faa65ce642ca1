// Showing what the kernel holds, and writing it where there is no room.
#include <fcntl.h>
#include <unistd.h>

#include "tests/tools/command_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

using testing::AllOf;
using testing::HasSubstr;
using testing::Not;

class ShowTest : public CommandTest {
 protected:
  void SetUp() override { MakeHost({{"base.tar", StandIn::Archive().File("motd", "hello\n")}}); }

  // Runs the command with standard output going to a device that is full.
  Result WriteToFullDevice(const Arguments& arguments) const {
    return Command(arguments, [] {
      const int full = open("/dev/full", O_WRONLY);
      if (full < 0 || dup2(full, STDOUT_FILENO) < 0) _exit(127);
    });
  }
};

TEST_F(ShowTest, NewKernel) {
  EXPECT_EQ(Shown(),
            "\n\n------------------------\nPolicy set in the kernel\n\n------------------------\n"
            "\n\n--------------------------------------------------------------\n"
            "Domain Name: rootDom Domain ID :0 Enforcement Level: enforcing\n"
            "State: 1 RefCount: 1 WorldRefCount: 1\n"
            "--------------------------------------------------------------\n"
            "\n\n\n---------------------------------\nObjects Defined: Name (Kernel Id)\n\n"
            "---------------------------------\ndefault (1)\ntardisk (2)\n"
            "\n\n--------------------\nTardisk Path (label)\n\n--------------------\n"
            "/tardisks/base.tar (default)\n");
}

TEST_F(ShowTest, OneDomain) {
  ASSERT_EQ(Load().status, 0);
  EXPECT_THAT(Done({"show", "--host", Host(), "2"}).out,
              AllOf(HasSubstr("Domain Name: globalVMDom Domain ID :2 "), Not(HasSubstr("appDom"))));
}

TEST_F(ShowTest, JsonIsAsDescribed) {
  Policy("domains/appDom", "-s open grant\n-r /motd rw\n");
  ASSERT_EQ(Load().status, 0);
  const std::string text = Done({"show", "--host", Host(), "--json"}).out;
  EXPECT_EQ(JsonProblem(text, "show"), "") << text;
  EXPECT_THAT(text, AllOf(HasSubstr("\"line\": \"-r /motd rw\""), HasSubstr("\"-s open grant\""),
                          HasSubstr("\"/tardisks/base.tar\""), HasSubstr("\"globalVMDom\"")));
}

TEST_F(ShowTest, JsonOfOneDomain) {
  ASSERT_EQ(Load().status, 0);
  const std::string text = Done({"show", "--host", Host(), "--json", "2"}).out;
  EXPECT_EQ(JsonProblem(text, "show"), "") << text;
  EXPECT_THAT(text, AllOf(HasSubstr("\"globalVMDom\""), Not(HasSubstr("\"name\": \"appDom\""))));
}

TEST_F(ShowTest, UnknownDomainIsAnError) {
  for (const char* id : {"1", "77", "4294967295"}) {
    const Result result = Command({"show", "--host", Host(), id});
    EXPECT_EQ(result.status, 1) << id;
    EXPECT_EQ(result.out, "") << id;
    EXPECT_EQ(result.err, std::string("Error: no domain has the id ") + id + "\n");
  }
}

TEST_F(ShowTest, ChangesNothing) {
  ASSERT_EQ(Load().status, 0);
  const std::string before = StandIn::ReadBytes(Host() + "/kernel.json");
  EXPECT_EQ(Shown(), Shown());
  EXPECT_EQ(StandIn::ReadBytes(Host() + "/kernel.json"), before);
}

TEST_F(ShowTest, FullDeviceDoesNotPassForSuccess) {
  for (const Arguments& arguments :
       {Arguments{"show", "--host", Host()}, Arguments{"host", "info", Host()},
        Arguments{"host", "assemble", Host()}, Arguments{"--help"}, Arguments{"--version"}}) {
    const Result result = WriteToFullDevice(arguments);
    EXPECT_EQ(result.status, 1) << arguments[0];
    EXPECT_EQ(result.err, "Error: standard output cannot be written\n") << arguments[0];
  }
}

TEST_F(ShowTest, LoadNeedsNoStandardOutput) {
  EXPECT_EQ(WriteToFullDevice({"load", "--host", Host(), PolicyDir()}).status, 0);
}

}  // namespace
}  // namespace SecPolicyTool
