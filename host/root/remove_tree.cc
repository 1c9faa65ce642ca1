#include "host/root/remove_tree.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstdio>
#include <vector>

#include "host/files/system_failure.h"
#include "host/files/unique_fd.h"
#include "host/root/beneath.h"

namespace StandIn {

namespace {

// Empties a directory without recursion, which would need a descriptor for each level of a tree
// that may have thousands: a directory met within another one is moved to the top and dealt with
// there.
//
// Another process may exchange entries meanwhile. So nothing is asked about a name before it is
// used: a call is made for the one kind of entry, and when the kernel says that the entry is of the
// other kind, the call for that one. No call follows a link or passes into another file system.
class TreeRemover {
 public:
  TreeRemover(const DirectoryRef& dir, const std::string& name)
      : dir_(dir), name_(name), shown_(dir.PathOf(name)) {}

  void Run() {
    if (Unlink(dir_.fd, name_) == Left::kNothing) return;
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
  enum class Left { kNothing, kDirectory };

  void RemoveTopEntry(const std::string& entry) {
    if (Unlink(top_.Get(), entry) == Left::kNothing) return;
    const UniqueFd directory = OpenForRemoval(top_.Get(), entry);
    for (const std::string& inner : Names(directory.Get())) {
      if (Unlink(directory.Get(), inner) == Left::kDirectory) MoveToTop(directory.Get(), inner);
    }
    Check(::unlinkat(top_.Get(), entry.c_str(), AT_REMOVEDIR));
  }

  void MoveToTop(int from, const std::string& inner) {
    for (bool isAccessible = false;;) {
      const std::string fresh = ".removed." + std::to_string(++moved_);
      if (::renameat(from, inner.c_str(), top_.Get(), fresh.c_str()) == 0) {
        return;
      }
      if (errno == EACCES && !isAccessible) {
        // Moving a directory changes its "..", which takes the right to write it.
        isAccessible = true;
        static_cast<void>(OpenForRemoval(from, inner));
        continue;
      }
      const bool isTaken = errno == ENOTEMPTY || errno == EEXIST || errno == ENOTDIR;
      Check(isTaken ? 0 : -1);
    }
  }

  // Removes anything but a directory.
  Left Unlink(int at, const std::string& name) {
    if (::unlinkat(at, name.c_str(), 0) == 0 || errno == ENOENT) return Left::kNothing;
    Check(errno == EISDIR ? 0 : -1);
    return Left::kDirectory;
  }

  // Opens the directory `name` for reading and changing, with other permissions where its own
  // forbid that.
  UniqueFd OpenForRemoval(int at, const std::string& name) {
    const std::string path = "/" + name;
    const UniqueFd directory = OpenBeneath(at, path, O_PATH | O_DIRECTORY | O_NOFOLLOW);
    Check(directory.Get());
    UniqueFd readable = OpenBeneath(directory.Get(), "/", O_RDONLY | O_DIRECTORY);
    const bool isReadable =
        readable.IsOpen() && ::faccessat(readable.Get(), ".", W_OK | X_OK, AT_EACCESS) == 0;
    if (isReadable) return readable;
    ChangeMode(directory.Get());
    readable = OpenBeneath(directory.Get(), "/", O_RDONLY | O_DIRECTORY);
    Check(readable.Get());
    return readable;
  }

  // There is no call for a descriptor that was opened with O_PATH, which alone can be had of a
  // directory that may not be read. The path stands for what the descriptor is open on, and for
  // nothing else.
  void ChangeMode(int directory) {
    const std::string self = "/proc/self/fd/" + std::to_string(directory);
    Check(::chmod(self.c_str(), S_IRWXU));
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
