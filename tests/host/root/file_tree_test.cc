// Paths below a directory that is taken for the root.
#include "host/root/file_tree.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <linux/filter.h>
#include <linux/seccomp.h>
#include <sys/prctl.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>

#include "host/root/beneath.h"
#include "host/root/path_walk.h"
#include "tests/support/archives.h"
#include "tests/support/child_process.h"
#include "tests/support/temporary_directory.h"

namespace StandIn {
namespace {

namespace fs = std::filesystem;

struct Case {
  const char* path;
  const char* resolved;  // null where `number` says why it cannot be
  int number = 0;
};

const Case kCases[] = {
    {"/", "/"},
    {"/etc", "/etc"},
    {"etc/motd", "/etc/motd"},
    {"//etc///motd", "/etc/motd"},
    {"/etc/./motd", "/etc/motd"},
    {"/etc/../etc/motd", "/etc/motd"},
    {"/../../etc", "/etc"},
    {"/etc/", "/etc"},
    {"/relative", "/etc/motd"},
    {"/absolute", "/etc/motd"},
    {"/upwards", "/etc/motd"},
    {"/directory/motd", "/etc/motd"},
    {"/directory/..", "/"},
    {"/directory/", "/etc"},
    {"/chain", "/etc/motd"},
    {"/outside", nullptr, ENOENT},
    {"/etc/motd/", nullptr, ENOTDIR},
    {"/etc/motd/x", nullptr, ENOTDIR},
    {"/etc/motd/..", nullptr, ENOTDIR},
    {"/absent", nullptr, ENOENT},
    {"/absent/..", nullptr, ENOENT},
    {"/loop", nullptr, ELOOP},
    {"/dangling", nullptr, ENOENT},
    {"", nullptr, ENOENT},
};

class FileTreeTest : public testing::Test {
 protected:
  FileTreeTest() {
    fs::create_directories(Root() + "/etc");
    WriteBytes(Root() + "/etc/motd", "inside");
    WriteBytes(directory_ / "motd", "outside");
    const std::pair<const char*, std::string> links[] = {
        {"relative", "etc/motd"}, {"absolute", "/etc/motd"}, {"upwards", "../../etc/motd"},
        {"directory", "/etc"},    {"chain", "absolute"},     {"outside", directory_ / "motd"},
        {"loop", "loop"},         {"dangling", "/absent"}};
    for (const auto& [name, target] : links) {
      fs::create_symlink(target, Root() + "/" + name);
    }
  }

  [[nodiscard]] std::string Root() const { return directory_ / "root"; }
  [[nodiscard]] UniqueFd OpenRoot() const {
    return UniqueFd(open(Root().c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
  }

  TemporaryDirectory directory_;
};

TEST_F(FileTreeTest, PathsAreResolvedBelowTheRoot) {
  const FileTree tree(OpenRoot());
  for (const Case& one : kCases) {
    const auto resolved = tree.Resolve(one.path);
    const int number = errno;
    EXPECT_EQ(resolved.value_or("none"), one.resolved == nullptr ? "none" : one.resolved)
        << one.path;
    if (!resolved) {
      EXPECT_EQ(number, one.number) << one.path;
    }
    EXPECT_EQ(tree.Exists(one.path), one.resolved != nullptr) << one.path;
  }
}

TEST_F(FileTreeTest, WalkComesWhereTheKernelComes) {
  const UniqueFd root = OpenRoot();
  for (const Case& one : kCases) {
    PathWalk walk(root.Get());
    const bool isThere = walk.Go(one.path, LastLink::kFollowed);
    const int number = errno;
    ASSERT_EQ(isThere, one.resolved != nullptr) << one.path;
    if (!isThere) {
      EXPECT_EQ(number, one.number) << one.path;
      continue;
    }
    EXPECT_EQ(walk.Path(), one.resolved) << one.path;
    struct stat walked {};
    struct stat named {};
    ASSERT_EQ(fstat(walk.Open(O_RDONLY).Get(), &walked), 0) << one.path;
    ASSERT_EQ(stat((Root() + one.resolved).c_str(), &named), 0);
    EXPECT_EQ(walked.st_ino, named.st_ino) << one.path;
  }
}

TEST_F(FileTreeTest, WalkKeepsTheLastLinkOnRequest) {
  const UniqueFd root = OpenRoot();
  PathWalk walk(root.Get());
  ASSERT_TRUE(walk.Go("/outside", LastLink::kKept));
  EXPECT_EQ(walk.Path(), "/outside");
  EXPECT_FALSE(walk.Open(O_RDONLY).IsOpen());
  EXPECT_EQ(errno, ELOOP);
}

TEST_F(FileTreeTest, TypeIsThatOfALinkItself) {
  const FileTree tree(OpenRoot());
  EXPECT_EQ(tree.LinkType("/etc"), mode_t{S_IFDIR});
  EXPECT_EQ(tree.LinkType("/etc/motd"), mode_t{S_IFREG});
  EXPECT_EQ(tree.LinkType("/directory"), mode_t{S_IFLNK});
  EXPECT_EQ(tree.LinkType("/absent"), mode_t{0});
  EXPECT_TRUE(tree.IsDirectory("/directory"));
  EXPECT_FALSE(tree.IsDirectory("/etc/motd"));
}

TEST_F(FileTreeTest, LongChainsAndPathsAreRefused) {
  std::string target = "/etc/motd";
  for (int i = 0; i < 41; ++i) {
    const std::string name = "link" + std::to_string(i);
    fs::create_symlink(target, Root() + "/" + name);
    target = "/" + name;
  }
  const UniqueFd root = OpenRoot();
  EXPECT_FALSE(PathWalk(root.Get()).Go(target, LastLink::kFollowed));
  EXPECT_EQ(errno, ELOOP);
  EXPECT_FALSE(PathWalk(root.Get()).Go(std::string(5000, 'x'), LastLink::kFollowed));
  EXPECT_EQ(errno, ENAMETOOLONG);
}

// As on an older kernel, or under an emulator that does not know the call.
void RemoveOpenat2() {
  sock_filter filter[] = {
      BPF_STMT(BPF_LD | BPF_W | BPF_ABS, offsetof(seccomp_data, nr)),
      BPF_JUMP(BPF_JMP | BPF_JEQ | BPF_K, SYS_openat2, 0, 1),
      BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ERRNO | ENOSYS),
      BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ALLOW),
  };
  const sock_fprog program{std::size(filter), filter};
  ASSERT_EQ(prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0), 0);
  ASSERT_EQ(prctl(PR_SET_SECCOMP, SECCOMP_MODE_FILTER, &program), 0);
}

TEST_F(FileTreeTest, PathsAreTheSameWithoutTheCall) {
  EXPECT_TRUE(ChildPassed(StartChild([&] {
    RemoveOpenat2();
    const FileTree tree(OpenRoot());
    for (const Case& one : kCases) {
      EXPECT_EQ(tree.Resolve(one.path).value_or("none"),
                one.resolved == nullptr ? "none" : one.resolved)
          << one.path;
      EXPECT_EQ(tree.Exists(one.path), one.resolved != nullptr) << one.path;
    }
    EXPECT_EQ(tree.LinkType("/directory"), mode_t{S_IFLNK});
  })));
}

TEST_F(FileTreeTest, FilesBeneathAreTheSameWithoutTheCall) {
  const struct {
    const char* path;
    int flags;
    int number;  // 0 where the file is opened
  } cases[] = {
      {"/", O_PATH, 0},
      {"/etc/motd", O_RDONLY, 0},
      {"/etc", O_RDONLY | O_DIRECTORY, 0},
      {"/relative", O_PATH | O_NOFOLLOW, 0},
      {"/relative", O_PATH, ELOOP},
      {"/relative", O_RDONLY, ELOOP},
      {"/directory/motd", O_RDONLY, ELOOP},
      {"/absent", O_RDONLY, ENOENT},
      {"/etc/motd/x", O_RDONLY, ENOTDIR},
      {"/etc/../../root", O_PATH, EXDEV},
      {"/..", O_PATH, EXDEV},
  };
  const auto expectAll = [&] {
    const UniqueFd root = OpenRoot();
    for (const auto& [path, flags, number] : cases) {
      const UniqueFd file = OpenBeneath(root.Get(), path, flags);
      const int reason = errno;
      EXPECT_EQ(file.IsOpen(), number == 0) << path;
      if (!file.IsOpen() && std::string(path).find("directory") == std::string::npos) {
        EXPECT_EQ(reason, number) << path;
      }
    }
  };
  expectAll();
  EXPECT_TRUE(ChildPassed(StartChild([&] {
    RemoveOpenat2();
    expectAll();
  })));
}

TEST_F(FileTreeTest, MachineHasItsOwnPaths) {
  EXPECT_EQ(FileTree::Machine().Resolve(Root() + "/relative"),
            fs::canonical(Root() + "/etc/motd").string());
  EXPECT_TRUE(FileTree::Machine().Exists(Root() + "/outside"));
}

}  // namespace
}  // namespace StandIn
