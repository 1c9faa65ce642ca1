// Making the files of the root file system.
#pragma once

#include <sys/types.h>

#include <cstdint>
#include <string>
#include <string_view>

#include "host/files/directory.h"
#include "host/files/unique_fd.h"

namespace StandIn {

// A file being written. It has no permissions for others than its owner until it is finished.
class NewFile {
 public:
  // Takes over the open, empty file that messages call `shown`.
  NewFile(UniqueFd fd, std::string shown);

  void WriteAt(std::uint64_t offset, std::string_view bytes);
  // Gives it its size, by a hole at its end where need be, and its permissions.
  void Finish(std::uint64_t size, mode_t mode);

 private:
  UniqueFd fd_;
  std::string shown_;
};

// Makes files below a directory. Never passes a symbolic link on the way nor follows one at its
// end, and changes permissions by descriptors alone, whatever other processes exchange meanwhile.
// Paths begin with "/", which stands for that directory. What is made must not be there yet, the
// directory above it must. Permissions are the mode's low nine bits whatever the process's mask,
// and directories have those of their owner in any case. All functions throw HostError "ROOT/PATH:
// cannot be DONE: REASON".
class TreeWriter {
 public:
  explicit TreeWriter(DirectoryRef root);

  void MakeDirectory(const std::string& path, mode_t mode) const;
  void SetDirectoryMode(const std::string& path, mode_t mode) const;
  void MakeSymlink(const std::string& path, const std::string& target) const;
  void MakeFifo(const std::string& path, mode_t mode) const;
  void MakeHardLink(const std::string& path, const std::string& target) const;
  // Gives the open file `fd` the name `path`; false where it cannot have one there: it lies in
  // another file system, or the kernel forbids names for files of others.
  [[nodiscard]] bool LinkFile(int fd, const std::string& path) const;
  [[nodiscard]] NewFile MakeFile(const std::string& path) const;
  // Anything but a directory.
  void Remove(const std::string& path) const;

 private:
  struct Place;

  [[nodiscard]] Place Locate(const std::string& path) const;

  DirectoryRef root_;
};

}  // namespace StandIn
