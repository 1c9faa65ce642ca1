#include "host/state/host_directory.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "secpolicy/host/host_error.h"
#include "tests/support/child_process.h"
#include "tests/support/temporary_directory.h"

namespace StandIn {
namespace {

using testing::UnorderedElementsAre;

class HostDirectoryTest : public testing::Test {
 protected:
  [[nodiscard]] std::string CreateError(const std::string& path) const {
    return MessageOf<HostError>([&] { HostDirectory::Create(path, "{}"); });
  }
  [[nodiscard]] std::string OpenError(const std::string& path) const {
    return MessageOf<HostError>([&] { HostDirectory host(path); });
  }

  TemporaryDirectory directory_;
  const std::string path_ = directory_ / "a/b/host";
};

TEST_F(HostDirectoryTest, CreatingMakesParentsAndFiles) {
  HostDirectory::Create(path_, "{\"limits\": {}}");
  EXPECT_THAT(NamesIn(path_), UnorderedElementsAre("host.json", "tardisks"));
  EXPECT_TRUE(NamesIn(path_ + "/tardisks").empty());
  const HostDirectory host(path_);
  EXPECT_EQ(host.DescriptionText(), "{\"limits\": {}}");
  EXPECT_EQ(host.Path(), path_);
}

TEST_F(HostDirectoryTest, CreatingKeepsWhatIsThere) {
  std::filesystem::create_directories(path_ + "/tardisks");
  WriteBytes(path_ + "/tardisks/base.tar", "archive");
  HostDirectory::Create(path_ + "//", "{}");
  EXPECT_EQ(ReadBytes(path_ + "/tardisks/base.tar"), "archive");
  EXPECT_EQ(HostDirectory(path_ + "/").Path(), path_);
}

TEST_F(HostDirectoryTest, AHostIsntMadeTwice) {
  HostDirectory::Create(path_, "first");
  EXPECT_EQ(CreateError(path_), path_ + " is a host directory already");
  EXPECT_EQ(HostDirectory(path_).DescriptionText(), "first");
}

TEST_F(HostDirectoryTest, ADanglingDescriptionIsntReplaced) {
  std::filesystem::create_directories(path_);
  std::filesystem::create_symlink("nowhere", path_ + "/host.json");
  EXPECT_EQ(CreateError(path_), path_ + " is a host directory already");
}

TEST_F(HostDirectoryTest, WhatStandsInTheWayIsNamed) {
  WriteBytes(directory_ / "a", "");
  EXPECT_EQ(CreateError(path_), path_ + ": cannot be made: Not a directory");
  const std::string forbidden = directory_ / "forbidden";
  std::filesystem::create_directory(forbidden);
  std::filesystem::permissions(forbidden, std::filesystem::perms(0555));
  std::filesystem::permissions(directory_.Path(), std::filesystem::perms(0755));
  EXPECT_TRUE(PassesAsOrdinaryUser([&] {
    EXPECT_EQ(CreateError(forbidden), forbidden + "/tardisks: cannot be made: Permission denied");
    EXPECT_EQ(CreateError(forbidden + "/host"),
              forbidden + "/host: cannot be made: Permission denied");
  }));
}

TEST_F(HostDirectoryTest, OpeningNeedsADescription) {
  std::filesystem::create_directories(path_);
  EXPECT_EQ(OpenError(path_), path_ +
                                  " is not a host directory: it has no host.json; make one with "
                                  "\"secpolicy host init " +
                                  path_ + "\"");
}

TEST_F(HostDirectoryTest, OpeningNeedsADirectory) {
  EXPECT_EQ(OpenError(path_), path_ +
                                  ": cannot be opened: No such file or directory; make one with "
                                  "\"secpolicy host init " +
                                  path_ + "\"");
  WriteBytes(directory_ / "file", "");
  EXPECT_EQ(OpenError(directory_ / "file"),
            directory_ / "file" + ": cannot be opened: Not a directory");
}

TEST_F(HostDirectoryTest, StaysReachableUnderItsDescriptor) {
  HostDirectory::Create(path_, "text");
  const HostDirectory host(path_);
  std::filesystem::rename(path_, directory_ / "moved");
  EXPECT_EQ(host.DescriptionText(), "text");
  EXPECT_EQ(::fcntl(host.Descriptor(), F_GETFD), FD_CLOEXEC);
  std::filesystem::remove(directory_ / "moved/host.json");
  EXPECT_EQ(MessageOf<HostError>([&] { static_cast<void>(host.DescriptionText()); }),
            path_ + "/host.json: cannot be opened: No such file or directory");
}

}  // namespace
}  // namespace StandIn
