#include "host/files/directory.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <memory>

#include "host/files/system_failure.h"

namespace StandIn {

namespace {

struct StreamCloser {
  void operator()(DIR* stream) const noexcept { ::closedir(stream); }
};

// Opens the directory anew, so that reading it doesn't move the position of anyone's descriptor.
std::unique_ptr<DIR, StreamCloser> OpenStream(const DirectoryRef& dir) {
  UniqueFd fd(::openat(dir.fd, ".", O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  std::unique_ptr<DIR, StreamCloser> stream(fd.IsOpen() ? ::fdopendir(fd.Get()) : nullptr);
  if (!stream) {
    throw SystemFailure(dir.path, "read", errno);
  }
  static_cast<void>(fd.Release());  // the stream owns it now
  return stream;
}

}  // namespace

UniqueFd OpenDirectory(const DirectoryRef& dir, const std::string& name) {
  UniqueFd fd(::openat(dir.fd, name.c_str(), O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC));
  if (!fd.IsOpen()) {
    const int number = errno;
    throw SystemFailure(dir.PathOf(name), "opened", number);
  }
  return fd;
}

std::vector<std::string> ListDirectory(const DirectoryRef& dir) {
  const auto stream = OpenStream(dir);
  std::vector<std::string> names;
  errno = 0;
  while (const dirent* entry = ::readdir(stream.get())) {
    const std::string name = entry->d_name;
    if (name != "." && name != "..") {
      names.push_back(name);
    }
    errno = 0;
  }
  if (errno != 0) {
    throw SystemFailure(dir.path, "read", errno);
  }
  return names;
}

void RequireNoOtherWriters(const DirectoryRef& dir) {
  if (::geteuid() != 0) return;
  struct stat status;
  if (::fstat(dir.fd, &status) != 0) throw SystemFailure(dir.path, "read", errno);
  const bool isGroups = (status.st_mode & S_IWGRP) != 0 && status.st_gid != 0;
  if (status.st_uid != 0 || isGroups || (status.st_mode & S_IWOTH) != 0) {
    throw HostError(dir.path +
                    ": users other than root can write to this directory; with "
                    "\"--trust-other-writers\" root works in it all the same");
  }
}

}  // namespace StandIn
