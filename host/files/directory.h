// Open directories.
#pragma once

#include <string>
#include <vector>

#include "host/files/unique_fd.h"

namespace StandIn {

// An open directory, owned elsewhere, and what messages call it. The descriptor may be an O_PATH
// one. The path is never resolved, so it may lie outside the root directory of this process.
struct DirectoryRef {
  int fd;
  std::string path;

  [[nodiscard]] std::string PathOf(const std::string& name) const { return path + "/" + name; }
};

// Opens the directory `name` for reading its entries and for syncing; a symbolic link there is not
// followed. Throws HostError "DIR/NAME: cannot be opened: REASON".
UniqueFd OpenDirectory(const DirectoryRef& dir, const std::string& name);

// The names in `dir` but "." and "..", in no particular order. Throws HostError "DIR: cannot be
// read: REASON".
std::vector<std::string> ListDirectory(const DirectoryRef& dir);

// For root: nobody else may exchange what is in `dir` under its hands. Does nothing for other
// users. Throws HostError "DIR: users other than root can write to this directory; with
// "--trust-other-writers" root works in it all the same".
void RequireNoOtherWriters(const DirectoryRef& dir);

}  // namespace StandIn
