// Hosts that other users than root can write to.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include "host/state/state_file.h"
#include "tests/host/root/host_fixture.h"
#include "tests/support/child_process.h"

namespace StandIn {
namespace {

class OtherWritersTest : public HostFixture {
 protected:
  void SetUp() override {
    if (::getuid() != 0) GTEST_SKIP() << "only root can own a host beside another user";
  }

  static std::string Refused(const std::string& directory) {
    return directory +
           ": users other than root can write to this directory; with \"--trust-other-writers\" "
           "root works in it all the same";
  }
  [[nodiscard]] std::string LockError() const {
    const StateFile state(Host());
    return MessageOf<HostError>([&] { const StateFile::Lock lock(state); });
  }
  [[nodiscard]] HostDirectory Trusted() const {
    HostDirectory host(Path());
    host.SetChanges({.otherWriters = OtherWriters::kTrusted});
    return host;
  }
  void SetMode(const std::string& path, mode_t mode) const {
    ASSERT_EQ(::chmod(path.c_str(), mode), 0);
  }
};

TEST_F(OtherWritersTest, RootLeavesAHostOfAnotherUserAlone) {
  GiveToOrdinaryUser(Path());
  EXPECT_EQ(AssembleError(), Refused(Path()));
  EXPECT_FALSE(Exists("kernel.lock"));
  Assemble(Trusted());
  EXPECT_TRUE(Exists("image.json"));
}

TEST_F(OtherWritersTest, RootLeavesAHostAloneThatOthersMayWriteTo) {
  for (const mode_t mode : {0777U, 01777U, 0757U}) {
    SetMode(Path(), mode);
    EXPECT_EQ(LockError(), Refused(Path())) << mode;
  }
  SetMode(Path(), 0775);
  EXPECT_EQ(LockError(), "(nothing was thrown)");  // the group is root's
  ASSERT_EQ(::chown(Path().c_str(), 0, kOrdinaryUser), 0);
  EXPECT_EQ(LockError(), Refused(Path()));
  SetMode(Path(), 0755);
  EXPECT_EQ(LockError(), "(nothing was thrown)");
}

TEST_F(OtherWritersTest, RootUnpacksNothingThatOthersMayExchange) {
  SetMode(Path("tardisks"), 0777);
  EXPECT_EQ(AssembleError(), Refused(Path("tardisks")));
  Assemble(Trusted());
}

TEST_F(OtherWritersTest, OtherUsersAreNotConcerned) {
  GiveToOrdinaryUser(Path() + "/..");
  GiveToOrdinaryUser(Path());
  GiveToOrdinaryUser(Path("tardisks"));
  SetMode(Path(), 0777);
  EXPECT_TRUE(PassesAsOrdinaryUser([&] { Assemble(Host()); }));
}

}  // namespace
}  // namespace StandIn
