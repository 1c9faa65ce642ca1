// The host that is used when none is named.
#include <unistd.h>

#include <cstdlib>
#include <filesystem>

#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

namespace fs = std::filesystem;
using testing::HasSubstr;

class OwnHostTest : public CommandTest {
 protected:
  [[nodiscard]] std::string Own() const { return Path("state/secpolicy/host"); }
};

TEST_F(OwnHostTest, IsMadeOnFirstUse) {
  const Result result = Done({"show"});
  EXPECT_THAT(result.out, HasSubstr("Domain Name: rootDom Domain ID :0 "));
  EXPECT_EQ(result.err, "");
  EXPECT_TRUE(fs::exists(Own() + "/host.json"));
  EXPECT_TRUE(fs::exists(Own() + "/image.json"));
}

TEST_F(OwnHostTest, KeepsWhatWasLoaded) {
  Policy("domains/appDom", "-s open grant\n");
  Done({"load", PolicyDir()});
  EXPECT_THAT(Done({"show"}).out, HasSubstr("-s open grant"));
}

TEST_F(OwnHostTest, IsAssembledWhenThatIsStillToBeDone) {
  Done({"host", "init", Own()});
  StandIn::WriteBytes(Own() + "/tardisks/base.tar",
                      StandIn::Archive().File("motd", "hello\n").Bytes());
  EXPECT_THAT(Done({"show"}).out, HasSubstr("/tardisks/base.tar (default)"));
}

TEST_F(OwnHostTest, IsBelowTheHomeDirectoryWithoutAStateDirectory) {
  for (const char* state : {"", "relative/path"}) {
    const Result result = Command({"show"}, [&] {
      setenv("XDG_STATE_HOME", state, 1);
      setenv("HOME", Path("home").c_str(), 1);
    });
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_TRUE(fs::exists(Path("home/.local/state/secpolicy/host/host.json"))) << state;
    fs::remove_all(Path("home"));
  }
}

TEST_F(OwnHostTest, NeedsADirectory) {
  for (const char* home : {"", "relative/path"}) {
    const Result result = Command({"show"}, [&] {
      unsetenv("XDG_STATE_HOME");
      setenv("HOME", home, 1);
    });
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.err,
              "Error: there is no directory for a host of your own: neither XDG_STATE_HOME nor "
              "HOME is set; name a host with --host DIR\n");
  }
}

TEST_F(OwnHostTest, IsLeftAloneWhenAnotherIsNamed) {
  MakeHost();
  Done({"show", "--host", Host()});
  ASSERT_EQ(Load().status, 0);
  EXPECT_FALSE(fs::exists(Path("state")));
}

}  // namespace
}  // namespace SecPolicyTool
