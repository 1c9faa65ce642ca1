// Loads on disks that cannot take what they write.
#include <gmock/gmock.h>
#include <linux/capability.h>
#include <signal.h>
#include <sys/mount.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

#include "tests/crash/loading_host.h"
#include "tests/crash/save_calls.h"
#include "tests/support/child_process.h"

namespace CrashTest {
namespace {

namespace fs = std::filesystem;

using SecPolicyTool::Result;
using StandIn::ChildResult;
using testing::EndsWith;

// Root obeys the modes of files from here on, also in the program that this process becomes.
void ObeyModes() {
  prctl(PR_CAPBSET_DROP, CAP_DAC_OVERRIDE);
  prctl(PR_CAPBSET_DROP, CAP_DAC_READ_SEARCH);
}

constexpr char kUserOverridesModes[] =
    "an ordinary user enters a host by a namespace that overrides the modes of its own files";

void LimitFileSize() {
  const struct rlimit limit { 500, RLIM_INFINITY };
  const struct rlimit noCore {};
  setrlimit(RLIMIT_CORE, &noCore);
  setrlimit(RLIMIT_FSIZE, &limit);
}

// In user namespaces, what else is forbidden on a mount has to stay so.
bool MakeReadOnly(const std::string& mounted) {
  struct statvfs status {};
  statvfs(mounted.c_str(), &status);
  const unsigned long kept = status.f_flag & (MS_NOSUID | MS_NODEV | MS_NOEXEC);
  const unsigned long flags = MS_REMOUNT | MS_BIND | MS_RDONLY | kept;
  return mount(nullptr, mounted.c_str(), nullptr, flags, nullptr) == 0;
}

class BadDiskTest : public LoadingHost {
 protected:
  BadDiskTest() : LoadingHost(2, 20) { SetState(OldState()); }

  [[nodiscard]] Result LoadAfter(const std::function<void()>& prepare) const {
    return Command({"load", "--host", Host(), PolicyDir()}, prepare);
  }

  // Expects a load that failed for this reason and changed nothing.
  void ExpectRefused(const Result& result, const std::string& reason) const {
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.err, EndsWith("Error: " + reason + "\n"));
    ExpectOldState();
  }

  void ExpectOldState() const {
    EXPECT_EQ(State(), OldState());
    EXPECT_THAT(LeftOver(), testing::IsEmpty());
  }

  void Fill() const {
    std::ofstream file(Host() + "/filler");
    while (file << std::string(512, 'x') << std::flush) continue;
  }
};

TEST_F(BadDiskTest, FullDisk) {
  fs::copy(Host(), Path("copy"), fs::copy_options::recursive);
  const ChildResult result = StandIn::RunOnSmallFileSystem(Host(), 262144, [&] {
    fs::copy(Path("copy"), Host(), fs::copy_options::recursive);
    Fill();
    const Result load = Load();
    fs::remove(Host() + "/filler");
    ExpectRefused(load, Host() + "/kernel.json: cannot be written: No space left on device");
    ExpectUsable();
  });
  if (result == ChildResult::kNotPermitted) GTEST_SKIP() << "file systems cannot be mounted here";
  EXPECT_EQ(result, ChildResult::kPassed);
}

TEST_F(BadDiskTest, ReadOnlyDisk) {
  const ChildResult result = StandIn::RunWithMount(Host(), Host(), [&] {
    ASSERT_TRUE(MakeReadOnly(Host()));
    ExpectRefused(Load(), Host() + "/kernel.lock: cannot be opened: Read-only file system");
    EXPECT_EQ(Command({"show", "--host", Host()}).status, 0);
  });
  if (result == ChildResult::kNotPermitted) GTEST_SKIP() << "file systems cannot be mounted here";
  EXPECT_EQ(result, ChildResult::kPassed);
  ExpectUsable();
}

TEST_F(BadDiskTest, FileSizeLimit) {
  ExpectRefused(LoadAfter(LimitFileSize),
                Host() + "/kernel.json: cannot be written: File too large");
  ExpectUsable();
}

TEST_F(BadDiskTest, DirectoryThatMayNotBeWrittenTo) {
  if (geteuid() != 0) GTEST_SKIP() << kUserOverridesModes;
  fs::permissions(Host(), fs::perms(0555));
  const Result load = LoadAfter(ObeyModes);
  fs::permissions(Host(), fs::perms(0755));
  ExpectRefused(load, Host() + "/kernel.json: cannot be written: Permission denied");
  ExpectUsable();
}

TEST_F(BadDiskTest, UnreadableParent) {
  fs::permissions(Path(""), fs::perms::none);
  const Result load = LoadAfter(ObeyModes);
  fs::permissions(Path(""), fs::perms(0755));
  ExpectRefused(load, Host() + ": cannot be opened: Permission denied");
  ExpectUsable();
}

TEST_F(BadDiskTest, DirectoryThatIsNotThere) {
  fs::rename(Host(), Path("moved"));
  const Result load = Load();
  EXPECT_EQ(load.status, 1);
  EXPECT_EQ(load.err, "Error: " + Host() +
                          ": cannot be opened: No such file or directory; make "
                          "one with \"secpolicy host init " +
                          Host() + "\"\n");
}

// What happens to the directory between the beginning of a load and its save.
class ChangedInLoadTest : public BadDiskTest {
 protected:
  void SetUp() override {
    if (!TracedProcess::IsPermitted()) GTEST_SKIP() << "processes cannot be traced here";
  }

  // A load before whose save `change` is done.
  [[nodiscard]] Result LoadWith(const std::function<void()>& change) const {
    SaveCalls load([&] {
      ObeyModes();
      BecomeLoad();
    });
    EXPECT_TRUE(load.Next().has_value());
    change();
    load.Finish();
    return {load.ExitStatus(), "", LoadErrors()};
  }
};

TEST_F(ChangedInLoadTest, DirectoryThatVanishes) {
  const Result load = LoadWith([&] { fs::remove_all(Host()); });
  EXPECT_EQ(load.status, 1);
  EXPECT_THAT(load.err, EndsWith("Error: " + Host() +
                                 "/kernel.json: cannot be written: No such file or directory\n"));
  EXPECT_FALSE(fs::exists(Host()));
}

// The host is the directory, not its name.
TEST_F(ChangedInLoadTest, DirectoryThatIsRenamedKeepsTheLoad) {
  const Result load = LoadWith([&] { fs::rename(Host(), Path("moved")); });
  EXPECT_EQ(load.status, 0) << load.err;
  EXPECT_FALSE(fs::exists(Host()));
  fs::rename(Path("moved"), Host());
  EXPECT_EQ(State(), NewState());
  ExpectUsable();
}

TEST_F(ChangedInLoadTest, DirectoryThatBecomesReadOnly) {
  if (geteuid() != 0) GTEST_SKIP() << kUserOverridesModes;
  const Result load = LoadWith([&] { fs::permissions(Host(), fs::perms(0555)); });
  fs::permissions(Host(), fs::perms(0755));
  ExpectRefused(load, Host() + "/kernel.json: cannot be written: Permission denied");
  ExpectUsable();
}

TEST_F(ChangedInLoadTest, ParentThatBecomesUnreadableIsNoMatter) {
  const Result load = LoadWith([&] { fs::permissions(Path(""), fs::perms::none); });
  fs::permissions(Path(""), fs::perms(0755));
  EXPECT_EQ(load.status, 0) << load.err;
  EXPECT_EQ(State(), NewState());
  ExpectUsable();
}

}  // namespace
}  // namespace CrashTest
