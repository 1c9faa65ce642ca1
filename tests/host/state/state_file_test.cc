#include "host/state/state_file.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>

#include <chrono>
#include <thread>

#include "tests/host/root/host_fixture.h"
#include "tests/support/child_process.h"

namespace StandIn {
namespace {

void Pause(int time) { std::this_thread::sleep_for(std::chrono::milliseconds(time)); }

class StateFileTest : public HostFixture {
 protected:
  // Whether anybody's lock would keep another one waiting.
  [[nodiscard]] bool IsLocked() const {
    const UniqueFd fd(::open(Path("kernel.lock").c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0666));
    struct flock range {};
    range.l_type = F_WRLCK;
    EXPECT_EQ(::fcntl(fd.Get(), F_OFD_GETLK, &range), 0);
    return range.l_type != F_UNLCK;
  }

  // Adds one to the number that the file holds, as often as asked.
  void Count(int times) const {
    StateFile state(Host());
    for (int i = 0; i < times; ++i) {
      const StateFile::Lock lock(state);
      const int number = std::stoi(state.Read().value_or("0"));
      state.Write(std::to_string(number + 1));
    }
  }

  StateFile state_{Host()};
};

TEST_F(StateFileTest, NothingIsThereBeforeTheFirstWrite) {
  EXPECT_EQ(state_.Read(), std::nullopt);
  EXPECT_FALSE(state_.CurrentVersion().exists);
  state_.Write("text");
  EXPECT_EQ(state_.Read(), "text");
  EXPECT_EQ(ReadBytes(Path("kernel.json")), "text");
}

// A host that root loaded can be read by whoever may read its directory.
TEST_F(StateFileTest, IsReadableWhateverTheMask) {
  for (const mode_t mask : {0000U, 0022U, 0077U, 0777U}) {
    const mode_t before = ::umask(mask);
    state_.Write("text");
    ::umask(before);
    struct stat status {};
    ASSERT_EQ(::stat(Path("kernel.json").c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0644U) << std::oct << mask;
  }
}

TEST_F(StateFileTest, RemovingTwiceIsFine) {
  state_.Write("text");
  state_.Remove();
  EXPECT_EQ(state_.Read(), std::nullopt);
  state_.Remove();
}

TEST_F(StateFileTest, ChangesOfOthersShow) {
  const StateFile::Version none = state_.CurrentVersion();
  EXPECT_FALSE(state_.ChangedSince(none));
  StateFile other(Host());
  other.Write("one");
  EXPECT_TRUE(state_.ChangedSince(none));
  EXPECT_EQ(state_.Read(), "one");
  const StateFile::Version one = state_.CurrentVersion();
  EXPECT_FALSE(state_.ChangedSince(one));
  for (int i = 0; i < 20; ++i) {
    other.Write("two");  // of the same size, and soon enough to have the same time
    EXPECT_TRUE(state_.ChangedSince(one));
  }
  other.Remove();
  EXPECT_TRUE(state_.ChangedSince(one));
  EXPECT_FALSE(state_.ChangedSince(none));
}

TEST_F(StateFileTest, ErrorsNameTheFile) {
  std::filesystem::create_directory(Path("kernel.json"));
  EXPECT_EQ(MessageOf<HostError>([&] { state_.Write("x"); }),
            Path("kernel.json") + ": cannot be written: Is a directory");
  EXPECT_EQ(MessageOf<HostError>([&] { state_.Remove(); }),
            Path("kernel.json") + ": cannot be removed: Is a directory");
  std::filesystem::create_directory(Path("kernel.lock"));
  EXPECT_EQ(MessageOf<HostError>([&] { StateFile::Lock lock(state_); }),
            Path("kernel.lock") + ": cannot be opened: Is a directory");
}

TEST_F(StateFileTest, LockIsHeldAsLongAsItsObjectLives) {
  {
    const StateFile::Lock lock(state_);
    EXPECT_TRUE(IsLocked());
  }
  EXPECT_FALSE(IsLocked());
}

TEST_F(StateFileTest, VersionIsThatOfWhatWasRead) {
  StateFile other(Host());
  other.Write("one");
  EXPECT_EQ(state_.Read(), "one");
  const StateFile::Version read = state_.LastVersion();
  EXPECT_EQ(read, other.CurrentVersion());
  other.Write("two");
  EXPECT_EQ(state_.LastVersion(), read);
  EXPECT_TRUE(state_.ChangedSince(read));
  other.Remove();
  EXPECT_EQ(state_.Read(), std::nullopt);
  EXPECT_EQ(state_.LastVersion(), StateFile::Version());
}

TEST_F(StateFileTest, ParentAndChildWithOneStateFileExcludeEachOther) {
  std::optional<StateFile::Lock> lock(std::in_place, state_);
  const pid_t child = StartChild([&] {
    const StateFile::Lock own(state_);
    state_.Write("child");
  });
  Pause(50);
  EXPECT_EQ(state_.Read(), std::nullopt);
  lock.reset();
  EXPECT_TRUE(ChildPassed(child));
  EXPECT_EQ(state_.Read(), "child");
}

TEST_F(StateFileTest, AChildsCopyOfALockGuardsNothing) {
  std::optional<StateFile::Lock> lock(std::in_place, state_);
  EXPECT_TRUE(ChildPassed(StartChild([&] { lock.reset(); })));
  EXPECT_TRUE(IsLocked());

  const pid_t sleeper = StartChild([] { ::pause(); });
  lock.reset();
  EXPECT_FALSE(IsLocked());
  ::kill(sleeper, SIGKILL);
  EXPECT_FALSE(ChildPassed(sleeper));
}

TEST_F(StateFileTest, ProcessesUnderTheLockLoseNothing) {
  constexpr int kTimes = 100;
  const pid_t first = StartChild([&] { Count(kTimes); });
  const pid_t second = StartChild([&] { Count(kTimes); });
  EXPECT_TRUE(ChildPassed(first));
  EXPECT_TRUE(ChildPassed(second));
  EXPECT_EQ(state_.Read(), std::to_string(2 * kTimes));
}

TEST_F(StateFileTest, AKilledWriterLeavesAWholeContent) {
  const std::string contents[] = {std::string(50000, 'a'), std::string(70000, 'b')};
  state_.Write(contents[0]);
  for (int round = 0; round < 20; ++round) {
    const pid_t writer = StartChild([&] {
      for (;;) {
        const StateFile::Lock lock(state_);
        state_.Write(contents[0]);
        state_.Write(contents[1]);
      }
    });
    Pause(1 + round);
    ::kill(writer, SIGKILL);
    EXPECT_FALSE(ChildPassed(writer));
    EXPECT_FALSE(IsLocked());
    const std::string content = state_.Read().value_or("");
    EXPECT_TRUE(content == contents[0] || content == contents[1]) << content.size();
  }
}

}  // namespace
}  // namespace StandIn
