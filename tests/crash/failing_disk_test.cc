// Operations whose state a disk takes in part, or not at all.
#include "tests/crash/failing_disk.h"

#include <gmock/gmock.h>

#include <cerrno>

#include "tests/host/module/module_fixture.h"
#include "tests/host/state/kept_module.h"

namespace CrashTest {
namespace {

using StandIn::KeptModule;

class FailingDiskTest : public StandIn::HostFixture {
 protected:
  FailingDiskTest() { kernel_.Create("oldDom"); }

  [[nodiscard]] std::string Kept() const { return StandIn::ReadBytes(Path("kernel.json")); }

  // Has an operation fail and expects that nothing came of it.
  void ExpectRefused(const FailingDisk::Faults& faults, const std::string& reason) {
    const std::string before = Kept();
    {
      const FailingDisk disk(faults);
      EXPECT_EQ(StandIn::RefusalOf([&] { kernel_.Create("newDom"); }),
                "EIO: " + Path("kernel.json") + ": cannot be written: " + reason);
    }
    EXPECT_EQ(Kept(), before);
    EXPECT_FALSE(Exists("kernel.json.new"));
    EXPECT_EQ(kernel_.Domains(), "rootDom oldDom");
    kernel_.Create("laterDom");
    EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom laterDom");
  }

  KeptModule kernel_{Host()};
};

TEST_F(FailingDiskTest, FirstWriteFails) {
  ExpectRefused({.failingWrite = 1, .number = EIO}, "Input/output error");
}

TEST_F(FailingDiskTest, WriteFailsAfterShortOnes) {
  ExpectRefused({.bytesAtATime = 100, .failingWrite = 3, .number = EIO}, "Input/output error");
}

TEST_F(FailingDiskTest, DiskTurnsOutToBeFullAtTheSync) {
  ExpectRefused({.failingSync = 1, .number = ENOSPC}, "No space left on device");
}

TEST_F(FailingDiskTest, ShortWritesAreContinued) {
  const FailingDisk disk({.bytesAtATime = 7});
  kernel_.Create("newDom");
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom newDom");
}

TEST_F(FailingDiskTest, InterruptedWritesAreContinued) {
  const FailingDisk disk({.bytesAtATime = 50, .failingWrite = 2, .number = EINTR});
  kernel_.Create("newDom");
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom newDom");
}

TEST_F(FailingDiskTest, BatchThatCannotBeSyncedIsLost) {
  const std::string before = Kept();
  kernel_.Keeper().BeginBatch();
  kernel_.Create("newDom");
  {
    const FailingDisk disk({.failingSync = 1, .number = EIO});
    EXPECT_EQ(StandIn::MessageOf<StandIn::HostError>([&] { kernel_.Keeper().Commit(); }),
              Path("kernel.json") + ": cannot be written: Input/output error");
  }
  EXPECT_EQ(Kept(), before);
  EXPECT_EQ(kernel_.Domains(), "rootDom oldDom");
}

// The one refusal after which the change is there: only a power failure could undo it.
TEST_F(FailingDiskTest, DirectoryThatCannotBeSyncedHasTheNewStateNevertheless) {
  {
    const FailingDisk disk({.failingSync = 2, .number = EIO});
    EXPECT_EQ(StandIn::RefusalOf([&] { kernel_.Create("newDom"); }),
              "EIO: " + Path("kernel.json") + ": cannot be written: Input/output error");
  }
  EXPECT_EQ(kernel_.Domains(), "rootDom oldDom newDom");
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom newDom");
}

}  // namespace
}  // namespace CrashTest
