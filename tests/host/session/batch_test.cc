// Operations that are kept together.
#include "tests/host/module/module_fixture.h"
#include "tests/host/state/kept_module.h"
#include "tests/support/child_process.h"

namespace StandIn {
namespace {

class BatchTest : public HostFixture {
 protected:
  BatchTest() { KeptModule(Host()).Create("oldDom"); }
};

TEST_F(BatchTest, BatchIsWrittenOnceAndAtItsCommit) {
  KeptModule kernel(Host());
  const std::string before = ReadBytes(Path("kernel.json"));
  kernel.Keeper().BeginBatch();
  kernel.Create("oneDom");
  kernel.Create("twoDom");
  EXPECT_EQ(kernel.Domains(), "rootDom oldDom oneDom twoDom");
  EXPECT_EQ(ReadBytes(Path("kernel.json")), before);
  kernel.Keeper().Commit();
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom oneDom twoDom");
}

TEST_F(BatchTest, BatchThatOnlyAskedWritesNothing) {
  KeptModule kernel(Host());
  const StateFile file(Host());
  const StateFile::Version before = file.CurrentVersion();
  kernel.Keeper().BeginBatch();
  kernel.Domains();
  kernel.Keeper().Commit();
  EXPECT_FALSE(file.ChangedSince(before));
}

TEST_F(BatchTest, BatchBeginsWithOthersChanges) {
  KeptModule kernel(Host());
  KeptModule(Host()).Create("otherDom");
  kernel.Keeper().BeginBatch();
  kernel.Create("newDom");
  kernel.Keeper().Commit();
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom otherDom newDom");
}

TEST_F(BatchTest, BatchOfAProcessThatEndsIsLost) {
  ASSERT_TRUE(ChildPassed(StartChild([&] {
    KeptModule kernel(Host());
    kernel.Keeper().BeginBatch();
    kernel.Create("newDom");
  })));
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom");
}

TEST_F(BatchTest, CommitWithoutABatchDoesNothing) {
  KeptModule kernel(Host());
  kernel.Keeper().Commit();
  kernel.Keeper().BeginBatch();
  kernel.Keeper().Commit();
  kernel.Keeper().Commit();
  kernel.Create("newDom");
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom newDom");
}

TEST_F(BatchTest, OthersChangesWaitUntilABatchIsCommitted) {
  KeptModule kernel(Host());
  kernel.Keeper().BeginBatch();
  const pid_t child = StartChild([&] {
    KeptModule other(Host());
    other.Create("otherDom");
    EXPECT_EQ(other.Domains(), "rootDom oldDom newDom otherDom");
  });
  kernel.Create("newDom");
  kernel.Keeper().Commit();
  EXPECT_TRUE(ChildPassed(child));
}

TEST_F(BatchTest, WhoReadsDuringABatchSeesWhatWasBefore) {
  KeptModule kernel(Host());
  kernel.Keeper().BeginBatch();
  kernel.Create("newDom");
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom");
  kernel.Keeper().Commit();
  EXPECT_EQ(KeptModule(Host()).Domains(), "rootDom oldDom newDom");
}

}  // namespace
}  // namespace StandIn
