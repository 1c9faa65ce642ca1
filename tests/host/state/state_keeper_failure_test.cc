// States that cannot be written or read.
#include <gmock/gmock.h>

#include <fstream>

#include "tests/host/module/module_fixture.h"
#include "tests/host/state/kept_module.h"
#include "tests/support/child_process.h"

namespace StandIn {
namespace {

namespace fs = std::filesystem;

class StateKeeperFailureTest : public HostFixture {
 protected:
  StateKeeperFailureTest() { KeptModule(Host()).Create("oldDom"); }

  // Runs `body` as an ordinary user who may read the host but not write to it.
  void AsReader(const std::function<void()>& body) {
    fs::permissions(Path(), fs::perms(0555));
    fs::permissions(Path("kernel.lock"), fs::perms(0666));
    GiveToOrdinaryUser(Path() + "/..");
    const bool passed = PassesAsOrdinaryUser(body);
    EXPECT_TRUE(passed);
    fs::permissions(Path(), fs::perms(0755));
  }
};

TEST_F(StateKeeperFailureTest, ChangeThatCannotBeWrittenIsRefusedAndUndone) {
  AsReader([&] {
    KeptModule kernel(Host());
    const std::string refusal =
        "EIO: " + Path("kernel.json") + ": cannot be written: Permission denied";
    EXPECT_EQ(RefusalOf([&] { kernel.Create("newDom"); }), refusal);
    EXPECT_EQ(kernel.Domains(), "rootDom oldDom");
    EXPECT_EQ(RefusalOf([&] { kernel.Create("newDom"); }), refusal);  // not EEXIST
  });
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom");
}

TEST_F(StateKeeperFailureTest, WhoMayOnlyReadMayAsk) {
  AsReader([&] { EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom"); });
}

TEST_F(StateKeeperFailureTest, FirstChangeThatCannotBeWrittenLeavesTheStateOfTheStart) {
  StateFile(Host()).Remove();
  AsReader([&] {
    KeptModule kernel(Host());
    EXPECT_NE(RefusalOf([&] { kernel.Create("newDom"); }), "(done)");
    EXPECT_EQ(kernel.Domains(), "rootDom");
  });
  EXPECT_FALSE(Exists("kernel.json"));
}

// A host on a file system that is full once it has been filled.
class FullFileSystemTest : public HostFixture {
 protected:
  void OnSmallFileSystem(const std::function<void(const HostDirectory&)>& body) const {
    const ChildResult result = RunOnSmallFileSystem(Path(), 65536, [&] {
      HostDirectory::Create(Path(), "{}");
      body(HostDirectory(Path()));
    });
    if (result == ChildResult::kNotPermitted) GTEST_SKIP() << "file systems cannot be mounted here";
    EXPECT_EQ(result, ChildResult::kPassed);
  }

  void Fill() const {
    std::ofstream file(Path("filler"));
    while (file << std::string(4096, 'x') << std::flush) continue;
  }
};

TEST_F(FullFileSystemTest, ChangeIsRefusedAndUndoneUntilThereIsRoom) {
  OnSmallFileSystem([&](const HostDirectory& host) {
    KeptModule kernel(host);
    kernel.Create("oldDom");
    Fill();
    EXPECT_EQ(RefusalOf([&] { kernel.Create("newDom"); }),
              "EIO: " + Path("kernel.json") + ": cannot be written: No space left on device");
    EXPECT_EQ(kernel.Domains(), "rootDom oldDom");
    EXPECT_EQ(KeptModule(host).Domains(), "rootDom oldDom");
    fs::remove(Path("filler"));
    EXPECT_EQ(RefusalOf([&] { kernel.Create("newDom"); }), "(done)");
    EXPECT_EQ(KeptModule(host).Domains(), "rootDom oldDom newDom");
  });
}

TEST_F(FullFileSystemTest, CommitFailsAndTheBatchIsLost) {
  OnSmallFileSystem([&](const HostDirectory& host) {
    KeptModule kernel(host);
    kernel.Create("oldDom");
    Fill();
    kernel.Keeper().BeginBatch();
    kernel.Create("newDom");
    EXPECT_EQ(HostErrorOf([&] { kernel.Keeper().Commit(); }),
              Path("kernel.json") + ": cannot be written: No space left on device");
    EXPECT_EQ(kernel.Domains(), "rootDom oldDom");
    fs::remove(Path("filler"));
    kernel.Create("laterDom");  // the lock is free, the batch over
    EXPECT_EQ(KeptModule(host).Domains(), "rootDom oldDom laterDom");
  });
}

TEST_F(StateKeeperFailureTest, StateThatAnotherDamagedIsRefusedUntilItIsWhole) {
  KeptModule kernel(Host());
  const std::string whole = ReadBytes(Path("kernel.json"));
  WriteBytes(Path("kernel.json"), "{");
  const std::string refusal = RefusalOf([&] { kernel.Module().FindDomain("oldDom"); });
  EXPECT_TRUE(refusal.starts_with("EIO: " + Path("kernel.json") + ":1:2: ")) << refusal;
  EXPECT_EQ(RefusalOf([&] { kernel.Create("newDom"); }), refusal);
  EXPECT_EQ(HostErrorOf([&] { kernel.Keeper().BeginBatch(); }), refusal.substr(5));
  EXPECT_EQ(ReadBytes(Path("kernel.json")), "{");
  WriteBytes(Path("kernel.json"), whole);
  EXPECT_EQ(kernel.Domains(), "rootDom oldDom");
}

}  // namespace
}  // namespace StandIn
