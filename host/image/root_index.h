// Finding the files of the assembled root file system by their inodes.
#pragma once

#include <sys/types.h>

#include <map>
#include <optional>
#include <string>
#include <unordered_map>

#include "host/image/host_directory.h"
#include "host/image/image_index.h"
#include "host/image/unique_fd.h"

namespace StandIn {

// Answers which path of the image a file is, and which archive brought it. The numbers of all files
// are looked up when the first question is asked; what is put into root/ by others, mounted there,
// or has been removed since is no part of the image. For one thread at a time.
class RootIndex {
 public:
  // `root` is a descriptor of root/ (O_PATH will do).
  RootIndex(const ImageIndex& index, UniqueFd root);

  // That of a host; nothing when the host has not been assembled. Throws HostError: "DIR/root:
  // cannot be opened: REASON" and the errors of ReadImage.
  static std::optional<RootIndex> Load(const HostDirectory& host);

  // The descriptor of root/, valid as long as this object.
  [[nodiscard]] int Root() const { return root_.Get(); }

  // The path within the root file system of the file with these numbers, beginning with "/"; of
  // several hard links the first in byte order. Nothing when the image has no such file.
  [[nodiscard]] std::optional<std::string> PathOf(dev_t device, ino_t inode) const;

  // The name of the archive that brought the file with this number in the root file system; empty
  // when none did.
  [[nodiscard]] std::string TardiskOf(ino_t inode) const;

 private:
  struct Found {
    std::string path;
    std::string tardisk;
  };

  // The files as they are on disk.
  struct Files {
    dev_t device;  // of root/
    std::unordered_map<ino_t, Found> byInode;
  };

  [[nodiscard]] const Files& AllFiles() const;
  void LookUp(const std::string& path, const std::string& tardisk, Files& files) const;

  std::map<std::string, std::string> tardiskOfPath_;
  UniqueFd root_;
  mutable std::optional<Files> files_;  // from the first question on
};

}  // namespace StandIn
