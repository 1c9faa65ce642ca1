// Which paths the root file system has while it is put together, and whose they are.
#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "host/root/image_index.h"

namespace StandIn {

enum class PathKind : std::uint8_t { kDirectory, kSymlink, kOther };

// Keeps account of the paths that the archives bring, one archive after the other, and decides what
// an entry may do; makes nothing itself. Paths are as EntryPath makes them. A refused entry is
// thrown as BadEntry and leaves the account unchanged.
//
// A later archive's file takes the place of an earlier one's. Directories are shared and belong to
// the first archive that brings them or something below them.
class ImageLayout {
 public:
  ImageLayout();

  // What is brought from here on belongs to the archive `name`.
  void BeginTardisk(const std::string& name);

  // Refuses what is made of the archives themselves:
  //   "only a directory may have this name: it holds the archives themselves"  /tardisks
  //   "nothing may be brought here: the directory holds the archives themselves"  what is below
  static void CheckName(const std::string& path, PathKind kind);

  // Brings the directories above `path`, and returns those that were not there yet, outermost
  // first.
  //   "passes through the symbolic link "/a" of "base.tar""
  //   "passes through "/a", which is not a directory in "base.tar""
  std::vector<std::string> BringParents(const std::string& path);

  enum class DirectoryUse { kMake, kSetMode, kLeave };
  // Brings the directory `path`; says whether it is to be made, or is there and this archive's own,
  // or is there and another's.
  //   "a directory here, but something else in "base.tar""
  DirectoryUse BringDirectory(const std::string& path);

  enum class FileUse { kMake, kReplace };
  // Brings anything else at `path`; says whether something is there that has to go first.
  //   "a directory in "base.tar", but something else here", "the root can only be a directory"
  FileUse BringFile(const std::string& path, PathKind kind);

  // What a hard link `path` to `target` would be.
  //   "the archive has brought no such file before", "the target is a directory",
  //   "the target is the link itself"
  [[nodiscard]] PathKind KindOfHardLink(const std::string& path, const std::string& target) const;

  // What every archive has now.
  [[nodiscard]] ImageIndex Index() const;

 private:
  struct Node {
    PathKind kind;
    std::size_t tardisk;
  };

  [[nodiscard]] std::string NameOf(const Node& node) const;

  std::vector<std::string> tardisks_;
  std::map<std::string, Node> nodes_;
};

}  // namespace StandIn
