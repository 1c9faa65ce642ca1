// Finding the files of the assembled root file system by their inodes.
#pragma once

#include <sys/stat.h>
#include <sys/types.h>

#include <deque>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

#include "host/files/unique_fd.h"
#include "host/root/file_tree.h"
#include "host/root/image_index.h"
#include "host/state/host_directory.h"

namespace StandIn {

// Answers which path of the image a file is, and which archive brought it. The numbers of all files
// are looked up when the first question is asked that needs them; what is put into root/ by others,
// mounted there, or has been removed since is no part of the image. For one thread at a time. A
// question throws ModuleError when there are no descriptors or no memory to look the files up with.
class RootIndex {
 public:
  // `root` is a descriptor of root/ (O_PATH will do).
  RootIndex(ImageIndex index, UniqueFd root) : image_(std::move(index)), tree_(std::move(root)) {}

  // That of a host; nothing when the host has not been assembled. `readRest` is called as ReadImage
  // says. Throws HostError: "DIR/root: cannot be opened: REASON" and the errors of ReadImage.
  static std::optional<RootIndex> Load(
      const HostDirectory& host, const std::function<void()>& readRest = [] {});

  // The root file system, and what is known of it.
  [[nodiscard]] const FileTree& Tree() const noexcept { return tree_; }
  [[nodiscard]] const ImageIndex& Image() const noexcept { return image_; }

  // The path within the root file system of the file with these numbers, beginning with "/"; of
  // several hard links the first in byte order. Nothing when the image has no such file.
  [[nodiscard]] std::optional<std::string> PathOf(dev_t device, ino_t inode) const;

  // The name of the archive that brought the file with this number in the root file system; empty
  // when none did.
  [[nodiscard]] std::string TardiskOf(ino_t inode) const;

 private:
  struct Found {
    std::string_view path;
    std::string_view tardisk;
  };

  // The files as they are on disk.
  struct Files {
    dev_t device;  // of root/
    std::unordered_map<ino_t, Found> byInode;
  };

  [[nodiscard]] const Files& AllFiles() const;
  // The policies of tardisks among them, which are what is asked about most: those of them whose
  // numbers no other path can have.
  [[nodiscard]] const Files& PolicyFiles() const;
  [[nodiscard]] Files NoFiles() const;
  // The paths that belong to no archive, and those of the archives, in byte order.
  [[nodiscard]] std::vector<Found> AllPaths() const;
  // The status of a file of the image; nothing when it is not there.
  [[nodiscard]] std::optional<struct stat> StatusOf(const Found& file) const;

  ImageIndex image_;
  FileTree tree_;
  mutable std::deque<std::string> ownPaths_;  // those that are not in image_
  mutable std::optional<Files> files_;        // from the first question on
  mutable std::optional<Files> policyFiles_;  // from the first question about a tardisk on
};

}  // namespace StandIn
