#include "host/root/root_index.h"

#include <fcntl.h>
#include <gtest/gtest.h>

#include "tests/host/root/host_fixture.h"
#include "tests/support/child_process.h"

namespace StandIn {
namespace {

class RootIndexTest : public HostFixture {
 protected:
  RootIndexTest() {
    Tardisk("base.tar", Archive()
                            .Directory("etc")
                            .File("etc/motd", "one")
                            .Symlink("link", "etc")
                            .HardLink("etc/again", "etc/motd"));
    Tardisk("extra.tar", Archive().File("etc/extra", "two"));
    Assembled();
  }

  [[nodiscard]] RootIndex Index() const { return RootIndex::Load(Host()).value(); }
  [[nodiscard]] static std::optional<std::string> PathOf(const RootIndex& index,
                                                         const struct stat& status) {
    return index.PathOf(status.st_dev, status.st_ino);
  }
  [[nodiscard]] std::optional<std::string> PathOf(const std::string& pathInRoot) const {
    return PathOf(Index(), Status(pathInRoot));
  }
};

TEST_F(RootIndexTest, FilesHaveTheirPathAndArchive) {
  const struct {
    const char* path;
    const char* tardisk;
  } cases[] = {
      {"/", ""},
      {"/etc", "base.tar"},
      {"/etc/extra", "extra.tar"},
      {"/link", "base.tar"},
      {"/tardisks", ""},
      {"/tardisks/base.tar", ""},
      {"/tardisks/extra.tar", ""},
  };
  for (const auto& [path, tardisk] : cases) {
    EXPECT_EQ(PathOf(path), path);
    EXPECT_EQ(OwnerOf(path), tardisk) << path;
  }
}

TEST_F(RootIndexTest, OfHardLinksTheFirstPathCounts) {
  EXPECT_EQ(PathOf("/etc/motd"), "/etc/again");
  EXPECT_EQ(PathOf("/etc/again"), "/etc/again");
  EXPECT_EQ(OwnerOf("/etc/motd"), "base.tar");
}

// What a load asks about is the policy of a tardisk; a host may have any number of other files.
TEST_F(RootIndexTest, PoliciesOfTardisksAreFoundWithoutTheOtherFiles) {
  const std::string policies = std::string(kTardiskPolicyDir).substr(1) + "/";
  Tardisk("base.tar", Archive()
                          .File(policies + "base", "")
                          .File(policies + "linked", "")
                          .HardLink("first", policies + "linked"));
  Assembled();
  const RootIndex index = Index();
  EXPECT_EQ(index.TardiskOf(Status("/" + policies + "base").st_ino), "base.tar");
  WriteBytes(Path("root/etc/new"), "");
  std::filesystem::rename(Path("root/etc/new"), Path("root/etc/extra"));
  EXPECT_EQ(PathOf(index, Status("/etc/extra")), "/etc/extra");
  EXPECT_EQ(Index().TardiskOf(Status("/" + policies + "linked").st_ino), "base.tar");
  EXPECT_EQ(Index().TardiskOf(Status("/etc/extra").st_ino), "extra.tar");
}

TEST_F(RootIndexTest, WhatCameOtherwiseIsUnknown) {
  WriteBytes(Path("root/etc/new"), "");
  EXPECT_EQ(PathOf("/etc/new"), std::nullopt);
  EXPECT_EQ(OwnerOf("/etc/new"), "");
}

TEST_F(RootIndexTest, TheDeviceCounts) {
  const struct stat motd = Status("/etc/motd");
  EXPECT_EQ(Index().PathOf(motd.st_dev + 1, motd.st_ino), std::nullopt);
}

TEST_F(RootIndexTest, WhatVanishedIsPassedOver) {
  const struct stat motd = Status("/etc/motd");
  const UniqueFd keptOpen(::open(Path("root/etc/motd").c_str(), O_PATH | O_CLOEXEC));
  std::filesystem::remove_all(Path("root/etc"));
  EXPECT_EQ(PathOf(Index(), motd), std::nullopt);
  EXPECT_EQ(PathOf("/link"), "/link");
}

TEST_F(RootIndexTest, LinksOnTheWayAreNotFollowed) {
  std::filesystem::rename(Path("root/etc"), Path("elsewhere"));
  std::filesystem::create_symlink(Path("elsewhere"), Path("root/etc"));
  struct stat motd {};
  ASSERT_EQ(::stat(Path("elsewhere/motd").c_str(), &motd), 0);
  EXPECT_EQ(PathOf(Index(), motd), std::nullopt);
}

TEST_F(RootIndexTest, WhatIsMountedOverAPathIsNotTheImages) {
  std::filesystem::create_directory(Path("policy"));
  WriteBytes(Path("policy/motd"), "outside");
  const ChildResult result = RunWithMount(Path("policy"), Path("root/etc"), [&] {
    ASSERT_EQ(Content("/etc/motd"), "outside");
    const HostDirectory host(Path());
    const RootIndex index = RootIndex::Load(host).value();
    EXPECT_EQ(PathOf(index, Status("/etc/motd")), std::nullopt);
    EXPECT_EQ(index.TardiskOf(Status("/etc/motd").st_ino), "");
    EXPECT_EQ(PathOf(index, Status("/link")), "/link");
  });
  if (result == ChildResult::kNotPermitted) {
    GTEST_SKIP() << "this user may not mount a directory";
  }
  EXPECT_EQ(result, ChildResult::kPassed);
}

TEST_F(RootIndexTest, AHostWithoutAnIndexIsNotAssembled) {
  std::filesystem::remove(Path("image.json"));
  EXPECT_FALSE(RootIndex::Load(Host()).has_value());
}

TEST_F(RootIndexTest, ADamagedIndexIsRefused) {
  WriteBytes(Path("image.json"), "{\"tardisks\": 3}");
  const std::string message = MessageOf<HostError>([&] { RootIndex::Load(Host()); });
  EXPECT_EQ(message.substr(0, message.find(": ")), Path("image.json"));
}

TEST_F(RootIndexTest, AnIndexWithoutARootIsRefused) {
  std::filesystem::rename(Path("root"), Path("moved"));
  EXPECT_EQ(MessageOf<HostError>([&] { RootIndex::Load(Host()); }),
            Path("root") + ": cannot be opened: No such file or directory");
}

}  // namespace
}  // namespace StandIn
