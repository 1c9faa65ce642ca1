// Following a path within a directory step by step.
#pragma once

#include <string>
#include <vector>

#include "host/files/unique_fd.h"

namespace StandIn {

enum class LastLink { kFollowed, kKept };

// Follows a path as the kernel does, from `rootFd` as the root directory: the way to do it where
// the kernel has no call for that, and the way to learn the path without links.
class PathWalk {
 public:
  explicit PathWalk(int rootFd) : rootFd_(rootFd) {}

  // Goes from the root along `path`. False, with the reason in errno, where that cannot be done.
  [[nodiscard]] bool Go(const std::string& path, LastLink lastLink);

  // Opens the file that was reached with the flags of open(2); O_NOFOLLOW and O_CLOEXEC are added.
  // Closed, with the reason in errno, when it fails.
  [[nodiscard]] UniqueFd Open(int flags) const;

  // The path of the file that was reached: absolute, without links.
  [[nodiscard]] std::string Path() const;

 private:
  struct Step {
    std::string name;
    UniqueFd fd;  // O_PATH
    bool isDirectory;
  };

  [[nodiscard]] bool Enter(const std::string& name, std::string& rest, LastLink lastLink);
  [[nodiscard]] bool FollowLink(const UniqueFd& link, std::string& rest);
  [[nodiscard]] bool IsInDirectory() const { return steps_.empty() || steps_.back().isDirectory; }
  [[nodiscard]] int Here() const { return steps_.empty() ? rootFd_ : steps_.back().fd.Get(); }

  int rootFd_;
  std::vector<Step> steps_;
  int followed_ = 0;
};

}  // namespace StandIn
