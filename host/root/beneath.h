// Paths within a directory tree that cannot lead out of it.
#pragma once

#include <string>

#include "host/files/unique_fd.h"

namespace StandIn {

// Opens `path`, which begins with "/", as if the directory `rootFd` were the root directory.
// `flags` are those of open(2) without O_CREAT; O_CLOEXEC is added. Neither symbolic links nor
// mounts on the way are passed, nor is a symbolic link at the end followed: with O_PATH |
// O_NOFOLLOW the link itself is opened. On failure the result is closed and errno says why (ELOOP,
// EXDEV, ...).
UniqueFd OpenBeneath(int rootFd, const std::string& path, int flags);

}  // namespace StandIn
