// From a policy directory to its policy files.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <filesystem>

#include "secpolicy/secpolicy.h"
#include "tests/core/descriptors.h"
#include "tests/core/directory_reads.h"
#include "tests/support/failing_allocations.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTest {
namespace {

using StandIn::MessageOf;
using Tavon::Lib::TavonException;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;
using Files = std::map<std::string, std::string>;

class GetFileListTest : public testing::Test {
 protected:
  void Write(const std::string& name) const { StandIn::WriteBytes(directory_ / name, "x\n"); }

  static Files Listed(const std::string& dir) {
    Files files;
    SecPolicy::GetFileList(dir, files);
    return files;
  }

  // The names, in the order of the list.
  std::vector<std::string> Names() const {
    std::vector<std::string> names;
    for (const auto& [path, name] : Listed(directory_.Path())) names.push_back(name);
    return names;
  }

  StandIn::TemporaryDirectory directory_;
};

// A failing private call without an error value quotes it later.
TEST_F(GetFileListTest, LeavesErrnoAsItIs) {
  Write("a");
  errno = EDOM;
  Listed(directory_.Path());
  EXPECT_EQ(errno, EDOM);
}

// ---- Names -------------------------------------------------------------------------------------

TEST_F(GetFileListTest, MapsFullPathsToNames) {
  Write("b");
  Write("a");
  EXPECT_THAT(Listed(directory_.Path()),
              ElementsAre(Pair(directory_ / "a", "a"), Pair(directory_ / "b", "b")));
}

TEST_F(GetFileListTest, OrderIsThatOfTheBytes) {
  for (const char* name : {"b", "a", "B", "_", "10", "9", "\xc3\xa9", "aa", "a b"}) Write(name);
  EXPECT_THAT(Names(), ElementsAre("10", "9", "B", "_", "a", "a b", "aa", "b", "\xc3\xa9"));
}

TEST_F(GetFileListTest, EveryNameIsAPolicyFile) {
  for (const char* name : {".hidden", "...", "..a", "backup~", "x.orig", "#x#", "a*"}) Write(name);
  EXPECT_THAT(Names(), ElementsAre("#x#", "...", "..a", ".hidden", "a*", "backup~", "x.orig"));
}

TEST_F(GetFileListTest, EmptyDirectoryHasNoFiles) { EXPECT_THAT(Names(), IsEmpty()); }

TEST_F(GetFileListTest, LongestNameIsListed) {
  Write(std::string(NAME_MAX, 'n'));
  EXPECT_THAT(Names(), ElementsAre(std::string(NAME_MAX, 'n')));
}

TEST_F(GetFileListTest, DirectoryOfManyFilesIsListedWhole) {
  for (int i = 0; i < 2000; ++i) Write("file" + std::to_string(i));
  EXPECT_EQ(Names().size(), 2000U);
}

TEST_F(GetFileListTest, FileThatMayNotBeReadIsListed) {
  Write("secret");
  ASSERT_EQ(chmod((directory_ / "secret").c_str(), 0), 0);
  EXPECT_THAT(Names(), ElementsAre("secret"));
}

TEST_F(GetFileListTest, SlashAtTheEndOfTheDirectoryIsDoubled) {
  Write("a");
  const std::string dir = directory_.Path() + "/";
  EXPECT_THAT(Listed(dir), ElementsAre(Pair(dir + "/a", "a")));
}

// ---- Kinds of entries --------------------------------------------------------------------------

TEST_F(GetFileListTest, SubDirectoriesAndLinksAreSkipped) {
  Write("b");
  Write("a");
  std::filesystem::create_directory(directory_ / "dir");
  std::filesystem::create_symlink(directory_ / "a", directory_ / "link");
  std::filesystem::create_symlink("absent", directory_ / "dangling");
  EXPECT_THAT(Names(), ElementsAre("a", "b"));
}

TEST_F(GetFileListTest, FilesOfSubDirectoriesAreNotListed) {
  std::filesystem::create_directory(directory_ / "dir");
  Write("dir/inner");
  EXPECT_THAT(Names(), IsEmpty());
}

TEST_F(GetFileListTest, HardLinkIsAFile) {
  Write("a");
  std::filesystem::create_hard_link(directory_ / "a", directory_ / "b");
  EXPECT_THAT(Names(), ElementsAre("a", "b"));
}

TEST_F(GetFileListTest, PipesAndSocketsAreSkipped) {
  Write("a");
  ASSERT_EQ(mkfifo((directory_ / "pipe").c_str(), 0600), 0);
  sockaddr_un address{AF_UNIX, {}};
  (directory_ / "socket").copy(address.sun_path, sizeof address.sun_path - 1);
  const int socketFd = socket(AF_UNIX, SOCK_STREAM, 0);
  ASSERT_EQ(bind(socketFd, reinterpret_cast<const sockaddr*>(&address), sizeof address), 0);
  close(socketFd);
  ASSERT_TRUE(std::filesystem::is_socket(directory_ / "socket"));
  EXPECT_THAT(Names(), ElementsAre("a"));
}

TEST_F(GetFileListTest, DevicesAreSkipped) {
  ASSERT_TRUE(std::filesystem::is_character_file("/dev/null"));
  EXPECT_EQ(Listed("/dev").count("/dev/null"), 0U);
}

TEST_F(GetFileListTest, EntryOfUnreportedTypeIsSkipped) {
  Write("a");
  Write("b");
  const UnreportedType hidden("a");
  EXPECT_THAT(Names(), ElementsAre("b"));
}

// ---- Failures ----------------------------------------------------------------------------------

TEST_F(GetFileListTest, DirectoryThatCannotBeOpenedIsRefused) {
  Write("file");
  for (const std::string& dir : {directory_ / "absent", directory_ / "file", std::string()}) {
    EXPECT_EQ(MessageOf<TavonException>([&] { Listed(dir); }),
              "Unable to open policy directory " + dir);
  }
}

TEST_F(GetFileListTest, DirectoryIsRefusedWhenNoDescriptorIsFree) {
  const std::string dir = directory_.Path();
  rlimit limit{};
  ASSERT_EQ(getrlimit(RLIMIT_NOFILE, &limit), 0);
  const rlimit none{static_cast<rlim_t>(LowestFreeDescriptor()), limit.rlim_max};
  ASSERT_EQ(setrlimit(RLIMIT_NOFILE, &none), 0);
  std::string message;
  // A sanitizer's own checks of a member call, and of the exception, take a descriptor.
  try {
    Listed(dir);
  } catch (const TavonException& failure) {
    setrlimit(RLIMIT_NOFILE, &limit);
    message = failure.what();
  }
  EXPECT_EQ(message, "Unable to open policy directory " + dir);
}

TEST_F(GetFileListTest, ReadErrorEndsTheListAndKeepsWhatWasRead) {
  for (const char* name : {"a", "b", "c", "d"}) Write(name);
  const FailingListing failing(3);
  // Of the three entries, "." and ".." may be two, or none.
  EXPECT_THAT(Names().size(), testing::AllOf(testing::Ge(1U), testing::Le(3U)));
}

TEST_F(GetFileListTest, ReadErrorAtOnceIsAnEmptyDirectory) {
  Write("a");
  const FailingListing failing(0);
  EXPECT_THAT(Names(), IsEmpty());
}

TEST_F(GetFileListTest, AddsToTheMapAndReplacesEntriesOfTheSamePath) {
  Write("a");
  Files files{{directory_ / "a", "old"}, {"/elsewhere/b", "b"}};
  SecPolicy::GetFileList(directory_.Path(), files);
  EXPECT_THAT(files, ElementsAre(Pair("/elsewhere/b", "b"), Pair(directory_ / "a", "a")));
}

TEST_F(GetFileListTest, RefusedDirectoryLeavesTheMapAsItIs) {
  Files files{{"/elsewhere/b", "b"}};
  EXPECT_THROW(SecPolicy::GetFileList(directory_ / "absent", files), TavonException);
  EXPECT_THAT(files, ElementsAre(Pair("/elsewhere/b", "b")));
}

TEST_F(GetFileListTest, LeavesNoDescriptorOpen) {
  Write("a");
  const int before = LowestFreeDescriptor();
  Names();
  {
    const FailingListing failing(1);
    Names();
  }
  EXPECT_EQ(LowestFreeDescriptor(), before);
}

TEST_F(GetFileListTest, ExhaustedMemoryPassesThroughAndTheDirectoryIsClosed) {
  Write("a-name-that-is-too-long-for-a-short-string");
  const int before = LowestFreeDescriptor();
  EXPECT_GT(FailEveryAllocationInTurn([&] { Listed(directory_.Path()); }), 3U);
  EXPECT_EQ(LowestFreeDescriptor(), before);
}

}  // namespace
}  // namespace SecPolicyTest
