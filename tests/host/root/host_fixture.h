// A host directory for a test.
#pragma once

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <optional>
#include <set>
#include <string>

#include "host/root/assemble.h"
#include "host/root/root_index.h"
#include "host/state/host_directory.h"
#include "secpolicy/host/host_error.h"
#include "tests/support/archives.h"
#include "tests/support/temporary_directory.h"

namespace StandIn {

class HostFixture : public testing::Test {
 protected:
  HostFixture() {
    HostDirectory::Create(Path(), "{}");
    host_.emplace(Path());
  }

  [[nodiscard]] std::string Path() const { return directory_ / "host"; }
  [[nodiscard]] std::string Path(const std::string& name) const { return Path() + "/" + name; }
  [[nodiscard]] const HostDirectory& Host() const { return *host_; }

  void Tardisk(const std::string& name, const std::string& bytes) const {
    WriteBytes(Path("tardisks/" + name), bytes);
  }
  void Tardisk(const std::string& name, const Archive& archive) const {
    Tardisk(name, archive.Bytes());
  }

  AssembleReport Assembled() const { return Assemble(Host()); }
  [[nodiscard]] std::string AssembleError(const UnpackLimits& limits = {}) const {
    return MessageOf<HostError>([&] { Assemble(Host(), limits); });
  }

  [[nodiscard]] struct stat Status(const std::string& pathInRoot) const {
    struct stat status {};
    EXPECT_EQ(::lstat(Path("root" + pathInRoot).c_str(), &status), 0) << pathInRoot;
    return status;
  }
  [[nodiscard]] mode_t Mode(const std::string& pathInRoot) const {
    return Status(pathInRoot).st_mode & 07777;
  }
  [[nodiscard]] std::string Content(const std::string& pathInRoot) const {
    return ReadBytes(Path("root" + pathInRoot));
  }
  [[nodiscard]] bool Exists(const std::string& name) const {
    return std::filesystem::exists(std::filesystem::symlink_status(Path(name)));
  }

  // The name of the archive whose file stands at a path of the root file system.
  [[nodiscard]] std::string OwnerOf(const std::string& pathInRoot) const {
    return RootIndex::Load(Host()).value().TardiskOf(Status(pathInRoot).st_ino);
  }

  // Everything in the host directory but the archives and the lock: path, inode, permissions, time
  // of the last change, content.
  [[nodiscard]] std::set<std::string> Snapshot() const {
    std::set<std::string> lines;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(Path())) {
      const std::string path = entry.path().string().substr(Path().size());
      if (!path.starts_with("/tardisks") && path != "/kernel.lock") {
        struct stat status {};
        ::lstat(entry.path().c_str(), &status);
        lines.insert(path + " " + std::to_string(status.st_ino) + " " +
                     std::to_string(status.st_mode) + " " + std::to_string(status.st_mtim.tv_nsec) +
                     " " + (S_ISREG(status.st_mode) ? ReadBytes(entry.path().string()) : ""));
      }
    }
    return lines;
  }

 private:
  TemporaryDirectory directory_;
  std::optional<HostDirectory> host_;
};

}  // namespace StandIn
