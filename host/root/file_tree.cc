#include "host/root/file_tree.h"

#include <fcntl.h>
#include <linux/openat2.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <memory>

#include "host/root/openat2.h"
#include "host/root/path_walk.h"

namespace StandIn {

namespace {

UniqueFd OpenInRoot(int rootFd, const std::string& path, int flags, std::uint64_t resolve) {
  return Openat2(rootFd, path, flags, RESOLVE_IN_ROOT | RESOLVE_NO_MAGICLINKS | resolve);
}

// Whether the call, and not the path, is what failed: an older kernel or emulator does not have it,
// filters of containers refuse it (the flags used here are never refused with EPERM otherwise), and
// it gives up where directories are moved while it follows "..".
bool IsCallRefused(int number) { return number == ENOSYS || number == EPERM || number == EAGAIN; }

}  // namespace

const FileTree& FileTree::Machine() {
  static const FileTree machine;
  return machine;
}

UniqueFd FileTree::Open(const std::string& path, int flags) const {
  if (isMachine_) return UniqueFd(::open(path.c_str(), flags | O_CLOEXEC));
  UniqueFd fd = OpenInRoot(Root(), path, flags, 0);
  if (fd.IsOpen() || !IsCallRefused(errno)) return fd;
  PathWalk walk(Root());
  const bool isKept = (flags & O_NOFOLLOW) != 0;
  if (!walk.Go(path, isKept ? LastLink::kKept : LastLink::kFollowed)) return UniqueFd();
  return walk.Open(flags);
}

DIR* FileTree::OpenDirectory(const std::string& path) const {
  UniqueFd fd = Open(path, O_RDONLY | O_DIRECTORY);
  DIR* stream = fd.IsOpen() ? fdopendir(fd.Get()) : nullptr;
  if (stream != nullptr) static_cast<void>(fd.Release());  // the stream owns it now
  return stream;
}

std::optional<std::string> FileTree::Resolve(const std::string& path) const {
  if (isMachine_) {
    const std::unique_ptr<char, decltype(&std::free)> found(realpath(path.c_str(), nullptr),
                                                            &std::free);
    return found ? std::optional<std::string>(found.get()) : std::nullopt;
  }
  const UniqueFd fd = OpenInRoot(Root(), path, O_PATH, RESOLVE_NO_SYMLINKS);
  if (fd.IsOpen()) {
    // Without links on the way, ".." leads where the text says.
    std::filesystem::path normal =
        std::filesystem::path(path.starts_with('/') ? path : "/" + path).lexically_normal();
    if (!normal.has_filename()) normal = normal.parent_path();
    return normal.string();
  }
  if (errno != ELOOP && !IsCallRefused(errno)) return std::nullopt;
  PathWalk walk(Root());
  if (!walk.Go(path, LastLink::kFollowed)) return std::nullopt;
  return walk.Path();
}

mode_t FileTree::LinkType(const std::string& path) const {
  const UniqueFd file = Open(path, O_PATH | O_NOFOLLOW);
  struct stat status {};
  if (!file.IsOpen() || fstat(file.Get(), &status) != 0) return 0;
  return status.st_mode & S_IFMT;
}

bool FileTree::IsDirectory(const std::string& path) const {
  return Open(path, O_PATH | O_DIRECTORY).IsOpen();
}

}  // namespace StandIn
