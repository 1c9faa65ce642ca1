// Files as a process sees them: all of this machine's, or those below a directory alone.
#pragma once

#include <dirent.h>
#include <fcntl.h>
#include <sys/types.h>

#include <optional>
#include <string>
#include <utility>

#include "host/files/unique_fd.h"

namespace StandIn {

// All functions leave the reason of a failure in errno, as the system calls do that they stand for.
class FileTree {
 public:
  // The files of this machine, by paths as this process resolves them.
  static const FileTree& Machine();

  // The files below the directory `root` (an O_PATH descriptor will do), as a process sees them
  // whose root and working directory it is: no link, no ".." and no absolute target of a link leads
  // out of it. Needs neither /proc nor rights beyond those to search and to read.
  explicit FileTree(UniqueFd root) : root_(std::move(root)), isMachine_(false) {}

  // Valid as long as this object; -1 for the machine.
  [[nodiscard]] int Root() const noexcept { return root_.Get(); }

  // open(2) without O_CREAT; O_CLOEXEC is added. Closed when it fails.
  [[nodiscard]] UniqueFd Open(const std::string& path, int flags) const;

  // opendir(3): null when it fails.
  [[nodiscard]] DIR* OpenDirectory(const std::string& path) const;

  // realpath(3); nothing when it fails.
  [[nodiscard]] std::optional<std::string> Resolve(const std::string& path) const;

  // The path without links, or `path` where it leads to no file.
  [[nodiscard]] std::string ResolvedOrSame(const std::string& path) const {
    return Resolve(path).value_or(path);
  }

  // The type of the file, S_IFREG and so on; 0 where there is none. A link is not followed.
  [[nodiscard]] mode_t LinkType(const std::string& path) const;
  [[nodiscard]] bool IsDirectory(const std::string& path) const;
  [[nodiscard]] bool Exists(const std::string& path) const { return Open(path, O_PATH).IsOpen(); }

 private:
  FileTree() = default;

  UniqueFd root_;
  bool isMachine_ = true;
};

}  // namespace StandIn
