// The lock of those who change a host: who may take it, and how long others wait for it.
#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/stat.h>

#include <chrono>
#include <optional>
#include <thread>

#include "host/root/image_file.h"
#include "host/state/state_file.h"
#include "tests/host/root/host_fixture.h"
#include "tests/support/child_process.h"

namespace StandIn {
namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;
using std::chrono::steady_clock;

class HostLockTest : public HostFixture {
 protected:
  [[nodiscard]] std::string LockPath() const { return Path("kernel.lock"); }

  // What taking the lock says, waiting as long as asked.
  [[nodiscard]] std::string ErrorAfter(seconds wait) const {
    HostDirectory host(Path());
    host.SetChanges({.wait = wait});
    const StateFile state(host);
    return MessageOf<HostError>([&] { const StateFile::Lock lock(state); });
  }
  [[nodiscard]] std::string HeldBy(const std::string& holder, int waited) const {
    return LockPath() + ": is locked by " + holder + ", which kept it for the " +
           std::to_string(waited) + " seconds of waiting; \"--wait SECONDS\" waits longer";
  }
  [[nodiscard]] mode_t LockMode() const {
    struct stat status {};
    EXPECT_EQ(::lstat(LockPath().c_str(), &status), 0);
    return status.st_mode & 07777;
  }
  void MakeLock(mode_t mode) const {
    WriteBytes(LockPath(), "");
    ASSERT_EQ(::chmod(LockPath().c_str(), mode), 0);
  }

  // Whether the child makes the file; one that fails before never does.
  [[nodiscard]] bool Appears(const std::string& name) const {
    const auto end = steady_clock::now() + seconds(60);
    while (!Exists(name) && steady_clock::now() < end) {
      std::this_thread::sleep_for(milliseconds(1));
    }
    return Exists(name);
  }

  StateFile state_{Host()};
};

TEST_F(HostLockTest, OnlyTheOwnerMayOpenIt) {
  const mode_t previous = ::umask(0);
  { const StateFile::Lock lock(state_); }
  ::umask(previous);
  EXPECT_EQ(LockMode(), 0600U);
}

TEST_F(HostLockTest, ThoseWhoMayWriteTheHostMayOpenIt) {
  std::filesystem::permissions(Path(), std::filesystem::perms(0775));
  const mode_t previous = ::umask(077);
  { const StateFile::Lock lock(state_); }
  ::umask(previous);
  EXPECT_EQ(LockMode(), 0660U);
}

TEST_F(HostLockTest, AnOldOneLosesItsPermissions) {
  MakeLock(0644);
  { const StateFile::Lock lock(state_); }
  EXPECT_EQ(LockMode(), 0600U);
}

TEST_F(HostLockTest, WhoMayOnlyReadTheHostCannotHoldUpItsOwner) {
  if (::getuid() != 0) GTEST_SKIP() << "only root can be another user";
  { const StateFile::Lock made(state_); }
  std::filesystem::permissions(Path() + "/..", std::filesystem::perms(0755));
  EXPECT_TRUE(PassesAsOrdinaryUser([&] {
    const UniqueFd fd(::open(LockPath().c_str(), O_RDONLY | O_CLOEXEC));
    EXPECT_FALSE(fd.IsOpen());
    EXPECT_EQ(ErrorAfter(seconds(0)), LockPath() + ": cannot be opened: Permission denied");
  }));
}

TEST_F(HostLockTest, HolderIsNamed) {
  const pid_t holder = StartChild([&] {
    const StateFile::Lock lock(state_);
    WriteBytes(Path("held"), "");
    ::pause();
  });
  ASSERT_TRUE(Appears("held"));
  EXPECT_EQ(ErrorAfter(seconds(0)), HeldBy("process " + std::to_string(holder), 0));
  ::kill(holder, SIGKILL);
  EXPECT_FALSE(ChildPassed(holder));
  EXPECT_EQ(ErrorAfter(seconds(0)), "(nothing was thrown)");
}

TEST_F(HostLockTest, HolderOfAnotherKindOfLockIsNamed) {
  MakeLock(0600);
  const pid_t holder = StartChild([&] {
    const UniqueFd fd(::open(LockPath().c_str(), O_RDONLY | O_CLOEXEC));
    struct flock range {};
    range.l_type = F_RDLCK;
    ASSERT_EQ(::fcntl(fd.Get(), F_SETLK, &range), 0);
    WriteBytes(Path("held"), "");
    ::pause();
  });
  ASSERT_TRUE(Appears("held"));
  EXPECT_EQ(ErrorAfter(seconds(0)), HeldBy("process " + std::to_string(holder), 0));
  ::kill(holder, SIGKILL);
  EXPECT_FALSE(ChildPassed(holder));
}

TEST_F(HostLockTest, WaitsAsLongAsAskedAndNoLonger) {
  const StateFile::Lock lock(state_);
  const auto start = steady_clock::now();
  EXPECT_EQ(ErrorAfter(seconds(1)), HeldBy("process " + std::to_string(::getpid()), 1));
  const auto taken = steady_clock::now() - start;
  EXPECT_GE(taken, seconds(1));
  EXPECT_LT(taken, seconds(20));
}

TEST_F(HostLockTest, TakesItAsSoonAsItIsFree) {
  std::optional<StateFile::Lock> lock(std::in_place, state_);
  const pid_t child = StartChild([&] { const StateFile::Lock own(state_); });
  std::this_thread::sleep_for(milliseconds(50));
  lock.reset();
  EXPECT_TRUE(ChildPassed(child));
}

// A lock file that was removed while it was held would let two in.
TEST_F(HostLockTest, ARemovedLockFileIsMadeAnew) {
  std::optional<StateFile::Lock> first(std::in_place, state_);
  const pid_t child = StartChild([&] {
    const StateFile::Lock own(state_);
    const UniqueFd fd(::open(LockPath().c_str(), O_RDWR | O_CLOEXEC));
    struct flock range {};
    range.l_type = F_WRLCK;
    EXPECT_EQ(::fcntl(fd.Get(), F_OFD_GETLK, &range), 0);
    EXPECT_EQ(range.l_type, F_WRLCK) << "the file of that name is not the locked one";
  });
  std::this_thread::sleep_for(milliseconds(50));
  std::filesystem::remove(LockPath());
  first.reset();
  EXPECT_TRUE(ChildPassed(child));
}

TEST_F(HostLockTest, OnlyARegularFileIsLocked) {
  const std::string notRegular = LockPath() + ": not a regular file";
  ASSERT_EQ(::mkfifo(LockPath().c_str(), 0600), 0);
  EXPECT_EQ(ErrorAfter(seconds(0)), notRegular);
  std::filesystem::remove(LockPath());
  std::filesystem::create_symlink("/dev/null", LockPath());
  EXPECT_EQ(ErrorAfter(seconds(0)),
            LockPath() + ": cannot be opened: Too many levels of symbolic links");
  std::filesystem::remove(LockPath());
  WriteBytes(Path("other"), "");
  ASSERT_EQ(::chmod(Path("other").c_str(), 0644), 0);
  std::filesystem::create_hard_link(Path("other"), LockPath());
  EXPECT_EQ(ErrorAfter(seconds(0)), LockPath() + ": has other names, which are not this host's");
  struct stat status {};
  ASSERT_EQ(::stat(Path("other").c_str(), &status), 0);
  EXPECT_EQ(status.st_mode & 07777, 0644U);
}

// Readers need no lock: what they read is replaced as a whole.
TEST_F(HostLockTest, ReadersAreNotHeldUp) {
  Tardisk("base.tar", Archive().File("f", "text"));
  Assembled();
  state_.Write("state");
  const StateFile::Lock lock(state_);
  EXPECT_EQ(RootIndex::Load(Host()).value().TardiskOf(Status("/f").st_ino), "base.tar");
  EXPECT_EQ(StateFile(Host()).Read(), "state");
}

TEST_F(HostLockTest, AnImageIsReadAnewWhenAnotherOneTookItsPlace) {
  Tardisk("one.tar", Archive().File("f", "text"));
  Assembled();
  int reads = 0;
  const auto index = ReadImage(Host(), [&] {
    if (++reads > 1) return;
    Tardisk("two.tar", Archive().File("g", "text"));
    Assembled();
  });
  EXPECT_EQ(reads, 2);
  EXPECT_EQ(index.value().tardisks.size(), 2U);
}

TEST_F(HostLockTest, AnImageThatIsPutIntoPlaceIsWaitedFor) {
  Tardisk("one.tar", Archive().File("f", "text"));
  Assembled();
  std::filesystem::rename(Path("image.json"), Path("kept"));
  std::thread end([&] {
    std::this_thread::sleep_for(milliseconds(100));
    std::filesystem::rename(Path("kept"), Path("image.json"));
  });
  EXPECT_TRUE(ReadImage(Host(), [] {}).has_value());
  end.join();
}

TEST_F(HostLockTest, AHostWithoutAnImageHasNone) {
  EXPECT_EQ(ReadImage(Host(), [] {}), std::nullopt);
  Assembled();
  std::filesystem::remove(Path("image.json"));
  EXPECT_EQ(ReadImage(Host(), [] {}), std::nullopt);  // an assembly that was killed: waited for
}

}  // namespace
}  // namespace StandIn
