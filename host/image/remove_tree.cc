#include "host/image/remove_tree.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstdio>
#include <vector>

#include "host/image/system_failure.h"
#include "host/image/unique_fd.h"

namespace StandIn {

namespace {

// Empties a directory without recursion, which would need a descriptor for each level of a tree
// that may have thousands: a directory met within another one is moved to the top and dealt with
// there.
class TreeRemover {
 public:
  TreeRemover(const DirectoryRef& dir, const std::string& name)
      : dir_(dir), name_(name), shown_(dir.PathOf(name)) {}

  void Run() {
    if (!IsDirectory(dir_.fd, name_)) {
      Unlink(dir_.fd, name_);
      return;
    }
    top_ = OpenForRemoval(dir_.fd, name_);
    for (std::vector<std::string> found = Names(top_.Get()); !found.empty();
         found = Names(top_.Get())) {
      for (const std::string& entry : found) {
        RemoveTopEntry(entry);
      }
    }
    Check(::unlinkat(dir_.fd, name_.c_str(), AT_REMOVEDIR));
  }

 private:
  void RemoveTopEntry(const std::string& entry) {
    if (!IsDirectory(top_.Get(), entry)) {
      Unlink(top_.Get(), entry);
      return;
    }
    const UniqueFd directory = OpenForRemoval(top_.Get(), entry);
    for (const std::string& inner : Names(directory.Get())) {
      if (IsDirectory(directory.Get(), inner)) {
        MoveToTop(directory.Get(), inner);
      } else {
        Unlink(directory.Get(), inner);
      }
    }
    Check(::unlinkat(top_.Get(), entry.c_str(), AT_REMOVEDIR));
  }

  void MoveToTop(int from, const std::string& inner) {
    MakeAccessible(from, inner);  // moving it changes its "..", which takes the right to write it
    for (;;) {
      const std::string fresh = ".removed." + std::to_string(++moved_);
      if (::renameat(from, inner.c_str(), top_.Get(), fresh.c_str()) == 0) {
        return;
      }
      const bool isTaken = errno == ENOTEMPTY || errno == EEXIST || errno == ENOTDIR;
      Check(isTaken ? 0 : -1);
    }
  }

  UniqueFd OpenForRemoval(int at, const std::string& name) {
    MakeAccessible(at, name);
    UniqueFd fd(::openat(at, name.c_str(), O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC));
    Check(fd.Get());
    return fd;
  }

  void MakeAccessible(int at, const std::string& name) {
    Check(::fchmodat(at, name.c_str(), S_IRWXU, 0));
  }

  bool IsDirectory(int at, const std::string& name) {
    struct stat status {};
    if (::fstatat(at, name.c_str(), &status, AT_SYMLINK_NOFOLLOW) != 0) {
      Check(errno == ENOENT ? 0 : -1);
    }
    return S_ISDIR(status.st_mode);
  }

  void Unlink(int at, const std::string& name) {
    if (::unlinkat(at, name.c_str(), 0) != 0) {
      Check(errno == ENOENT ? 0 : -1);
    }
  }

  [[nodiscard]] std::vector<std::string> Names(int directory) const {
    return ListDirectory({directory, shown_});
  }

  // Throws if a call answered -1.
  void Check(int result) const {
    if (result < 0) {
      throw SystemFailure(shown_, "removed", errno);
    }
  }

  const DirectoryRef& dir_;
  const std::string& name_;
  std::string shown_;
  UniqueFd top_;
  unsigned long moved_ = 0;
};

}  // namespace

void RemoveTree(const DirectoryRef& dir, const std::string& name) { TreeRemover(dir, name).Run(); }

}  // namespace StandIn
