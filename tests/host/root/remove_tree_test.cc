#include "host/root/remove_tree.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include "secpolicy/host/host_error.h"
#include "tests/support/child_process.h"
#include "tests/support/temporary_directory.h"

namespace StandIn {
namespace {

using testing::IsEmpty;
using testing::UnorderedElementsAre;

class RemoveTreeTest : public testing::Test {
 protected:
  RemoveTreeTest()
      : fd_(::open(directory_.Path().c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC)),
        ref_{fd_.Get(), "D"} {}

  void MakeDirectories(const std::string& path) const {
    std::filesystem::create_directories(directory_ / path);
  }
  [[nodiscard]] std::vector<std::string> Left() const { return NamesIn(directory_.Path()); }

  TemporaryDirectory directory_;
  UniqueFd fd_;
  DirectoryRef ref_;
};

TEST_F(RemoveTreeTest, NothingThereIsFine) {
  RemoveTree(ref_, "tree");
  EXPECT_THAT(Left(), IsEmpty());
}

TEST_F(RemoveTreeTest, RemovesEverythingBelow) {
  MakeDirectories("tree/a/b");
  MakeDirectories("tree/c/b");  // two of a name meet at the top
  MakeDirectories("tree/.removed.1/d");
  WriteBytes(directory_ / "tree/.removed.2", "");
  WriteBytes(directory_ / "tree/a/b/file", "x");
  ASSERT_EQ(::mkfifo((directory_ / "tree/a/fifo").c_str(), 0600), 0);
  RemoveTree(ref_, "tree");
  EXPECT_THAT(Left(), IsEmpty());
}

TEST_F(RemoveTreeTest, LinksAreRemovedNotFollowed) {
  MakeDirectories("kept");
  WriteBytes(directory_ / "kept/file", "x");
  MakeDirectories("tree/a");
  std::filesystem::create_symlink("../kept", directory_ / "tree/link");
  std::filesystem::create_symlink("../../kept", directory_ / "tree/a/link");
  RemoveTree(ref_, "tree");
  std::filesystem::create_symlink("kept", directory_ / "tree");
  RemoveTree(ref_, "tree");
  EXPECT_THAT(Left(), UnorderedElementsAre("kept"));
  EXPECT_EQ(ReadBytes(directory_ / "kept/file"), "x");
}

TEST_F(RemoveTreeTest, DirectoriesWithoutPermissionsAreNoObstacle) {
  GiveToOrdinaryUser(directory_.Path());
  EXPECT_TRUE(PassesAsOrdinaryUser([&] {
    MakeDirectories("tree/a/b/c");
    WriteBytes(directory_ / "tree/a/b/file", "x");
    for (const char* path : {"tree/a/b/c", "tree/a/b", "tree/a", "tree"}) {
      std::filesystem::permissions(directory_ / path, std::filesystem::perms::none);
    }
    RemoveTree(ref_, "tree");
    EXPECT_THAT(Left(), IsEmpty());
  }));
}

TEST_F(RemoveTreeTest, DepthNeedsNoDescriptors) {
  EXPECT_TRUE(ChildPassed(StartChild([&] {
    const struct rlimit few { 32, 32 };
    ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &few), 0);
    MakeDirectories("tree");
    UniqueFd deepest(::open((directory_ / "tree").c_str(), O_PATH | O_CLOEXEC));
    for (int level = 0; level < 3000; ++level) {
      ASSERT_EQ(::mkdirat(deepest.Get(), "d", 0700), 0);
      deepest = UniqueFd(::openat(deepest.Get(), "d", O_PATH | O_CLOEXEC));
    }
    RemoveTree(ref_, "tree");
    EXPECT_THAT(Left(), IsEmpty());
  })));
}

TEST_F(RemoveTreeTest, WhatMayNotBeRemovedIsNamed) {
  MakeDirectories("tree/a");
  std::filesystem::permissions(directory_.Path(), std::filesystem::perms(0755));
  if (::getuid() != 0) {
    GTEST_SKIP() << "only root can make a tree of another user's";
  }
  EXPECT_TRUE(PassesAsOrdinaryUser([&] {
    EXPECT_EQ(MessageOf<HostError>([&] { RemoveTree(ref_, "tree"); }),
              "D/tree: cannot be removed: Permission denied");
  }));
  EXPECT_TRUE(std::filesystem::exists(directory_ / "tree/a"));
}

}  // namespace
}  // namespace StandIn
