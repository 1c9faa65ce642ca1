// prctl with the option that resolves a path, and its other options.
#include <sys/prctl.h>

#include <array>
#include <filesystem>

#include "tests/host/gate/gate_fixture.h"

namespace StandIn {
namespace {

using SecPolicyTest::Operation;
using SecPolicyTest::Outcome;
using testing::ElementsAre;
using testing::IsEmpty;

constexpr int kResolve = 4109;

// The path that the kernel makes of `path`, or the errno's name.
std::string Resolve(const char* path) {
  std::array<char, 1984> buffer{};
  return prctl(kResolve, path, buffer.data()) == 0 ? buffer.data() : strerrorname_np(errno);
}

class PathResolutionTest : public GateTest {
 protected:
  PathResolutionTest() {
    Tardisk("base.tar")
        .Directory("etc")
        .File("etc/motd", "hello\n")
        .Symlink("etc/link", "motd")
        .Symlink("conf", "etc")
        .Symlink("up", "../../..")
        .Symlink("loop", "loop")
        .Symlink("dangling", "nothing");
  }
};

TEST_F(PathResolutionTest, GivesThePathBehindLinksAndDots) {
  struct Row {
    const char* path;
    const char* resolved;
  };
  InHost([] {
    for (const Row& row : {Row{"/etc/motd", "/etc/motd"}, Row{"/conf/link", "/etc/motd"},
                           Row{"/etc/../etc/./motd", "/etc/motd"}, Row{"//etc//", "/etc"},
                           Row{"/", "/"}, Row{"/up/conf", "/etc"}, Row{"etc/motd", "/etc/motd"},
                           Row{"/nothing", "ENOENT"}, Row{"/dangling", "ENOENT"},
                           Row{"/etc/motd/x", "ENOTDIR"}, Row{"/loop", "ELOOP"}, Row{"", "ENOENT"}})
      EXPECT_EQ(Resolve(row.path), row.resolved) << row.path;
  });
}

TEST_F(PathResolutionTest, IsAnOperationThatCanBeRefused) {
  Fail(Operation::kResolvePath, 2, EACCES);
  const Outcome outcome = Run([] { return InTurn({Resolve("/conf/link"), Resolve("/etc")}); });
  EXPECT_EQ(outcome.value, "/etc/motd, EACCES");
  EXPECT_THAT(outcome.Operations(),
              ElementsAre("resolve-path /conf/link",
                          "resolve-path /etc ! refused on request: resolve-path, call 2"));
}

TEST_F(PathResolutionTest, PathThatLeadsNowhereIsTracedAsARefusal) {
  EXPECT_THAT(Run([] { return Resolve("/nothing"); }).Operations(),
              ElementsAre("resolve-path /nothing ! \"/nothing\" cannot be resolved: "
                          "No such file or directory"));
}

TEST_F(PathResolutionTest, RefusalWithoutAnErrnoIsAnInputOutputError) {
  Fail(Operation::kResolvePath, 1, 0);
  EXPECT_EQ(Run([] { return Resolve("/etc"); }).value, "EIO");
}

TEST_F(PathResolutionTest, BadAddressesAreErrors) {
  const Outcome outcome = Run([] {
    std::array<char, 1984> buffer{};
    LastPage page;
    const auto resolve = [](const void* path, void* to) {
      return ResultText(prctl(kResolve, path, to));
    };
    std::vector<std::string> answers{resolve(nullptr, buffer.data()),
                                     resolve(Address(~0UL), buffer.data()),
                                     resolve(page.PutAtEnd("/etc"), buffer.data()),
                                     resolve("/etc", nullptr), resolve("/etc", page.End() - 4)};
    page.MakeReadOnly();
    answers.push_back(resolve("/etc", page.Begin()));
    return InTurn(answers);
  });
  EXPECT_EQ(outcome.value, "EFAULT, EFAULT, EFAULT, EFAULT, EFAULT, EFAULT");
}

TEST_F(PathResolutionTest, TextsMayEndWhereMemoryEnds) {
  InHost([] {
    LastPage from;
    LastPage to;
    char* buffer = to.End() - 5;
    EXPECT_EQ(prctl(kResolve, from.PutAtEnd({"/conf\0", 6}), buffer), 0);
    EXPECT_EQ(std::string(buffer, 5), std::string("/etc\0", 5));
  });
}

TEST_F(PathResolutionTest, PathOf1983BytesIsTheLongest) {
  InHost([] {
    const std::string root(1980, '/');
    EXPECT_EQ(Resolve((root + "etc").c_str()), "/etc");
    EXPECT_EQ(Resolve((root + "/etc").c_str()), "ENAMETOOLONG");
  });
}

TEST_F(PathResolutionTest, ResultOf1983BytesIsTheLongest) {
  Assemble();
  const std::string name(198, 'n');
  std::string deep;
  for (int i = 0; i < 9; ++i) deep += "/" + name;  // 1,791 bytes
  const std::string longest = deep + "/" + std::string(191, 'n');
  std::filesystem::create_directories(InRoot(longest));
  std::filesystem::create_directories(InRoot(longest + "n"));
  std::filesystem::create_directory_symlink(deep, InRoot("/deep"));
  InHost([&] {
    EXPECT_EQ(Resolve(("/deep/" + std::string(191, 'n')).c_str()), longest);
    EXPECT_EQ(longest.size(), 1983u);
    EXPECT_EQ(Resolve(("/deep/" + std::string(192, 'n')).c_str()), "ENAMETOOLONG");
  });
}

TEST_F(PathResolutionTest, OtherOptionsAreTheKernels) {
  const Outcome outcome = Run([] {
    std::array<char, 16> name{};
    prctl(PR_SET_NAME, "renamed");
    prctl(PR_GET_NAME, name.data());
    return InTurn({name.data(), ResultText(prctl(PR_GET_NO_NEW_PRIVS, 0, 0, 0, 0)),
                   ResultText(prctl(kResolve - 1, "/etc", name.data())),
                   ResultText(prctl(kResolve + 1, "/etc", name.data()))});
  });
  EXPECT_EQ(outcome.value, "renamed, 1, EINVAL, EINVAL");
  EXPECT_THAT(outcome.Operations(), IsEmpty());
}

TEST_F(PathResolutionTest, WithoutAHostTheKernelHasNoSuchOption) {
  BehindTheGate([] { EXPECT_EQ(Resolve("/"), "EINVAL"); });
}

}  // namespace
}  // namespace StandIn
