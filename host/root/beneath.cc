#include "host/root/beneath.h"

#include <fcntl.h>
#include <linux/openat2.h>
#include <sys/stat.h>

#include <cerrno>
#include <utility>

#include "host/root/openat2.h"

namespace StandIn {

namespace {

UniqueFd RefusedWith(int number) {
  errno = number;
  return {};
}

// What openat2 refuses by itself: links, other than those that O_NOFOLLOW asks for, and mounts.
UniqueFd Checked(UniqueFd fd, int rootFd, int flags) {
  struct stat root {};
  struct stat status {};
  if (!fd.IsOpen() || fstat(rootFd, &root) != 0 || fstat(fd.Get(), &status) != 0) return {};
  if (S_ISLNK(status.st_mode) && (flags & O_NOFOLLOW) == 0) return RefusedWith(ELOOP);
  return status.st_dev == root.st_dev ? std::move(fd) : RefusedWith(EXDEV);
}

// For kernels and emulators that do not have the call. A mount of the same file system is not
// noticed.
UniqueFd OpenStepByStep(int rootFd, const std::string& relative, int flags) {
  UniqueFd above;
  int here = rootFd;
  for (std::size_t begin = 0, end = 0; (end = relative.find('/', begin)) != std::string::npos;
       begin = end + 1) {
    const std::string name = relative.substr(begin, end - begin);
    if (name == "..") return RefusedWith(EXDEV);
    UniqueFd next =
        Checked(UniqueFd(openat(here, name.c_str(), O_PATH | O_NOFOLLOW | O_DIRECTORY | O_CLOEXEC)),
                rootFd, 0);
    if (!next.IsOpen()) return next;
    above = std::move(next);
    here = above.Get();
  }
  const std::string last = relative.substr(relative.rfind('/') + 1);
  if (last == "..") return RefusedWith(EXDEV);
  return Checked(UniqueFd(openat(here, last.c_str(), flags | O_NOFOLLOW | O_CLOEXEC)), rootFd,
                 flags);
}

}  // namespace

UniqueFd OpenBeneath(int rootFd, const std::string& path, int flags) {
  const std::string relative = path == "/" ? "." : path.substr(1);
  UniqueFd fd =
      Openat2(rootFd, relative, flags, RESOLVE_BENEATH | RESOLVE_NO_SYMLINKS | RESOLVE_NO_XDEV);
  if (fd.IsOpen() || errno != ENOSYS) return fd;
  return OpenStepByStep(rootFd, relative, flags);
}

}  // namespace StandIn
