#include "host/session/change_root.h"

#include <fcntl.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <string_view>

#include "host/files/system_failure.h"
#include "host/files/unique_fd.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

namespace {

// A directory outside, taken hold of before the root directory changes.
struct VisibleTree {
  std::string path;
  UniqueFd tree;
};

[[noreturn]] void RefuseToEnter(const char* call, int number) {
  throw HostError(std::string("the host cannot be entered: ") + call + ": " +
                  std::strerror(number) +
                  "; this needs either root's rights to mount and to change root (CAP_SYS_ADMIN, "
                  "CAP_SYS_CHROOT) or user namespaces for ordinary users (the settings "
                  "user.max_user_namespaces and, where there is one, "
                  "kernel.unprivileged_userns_clone)");
}

void WriteSelf(const char* file, std::string_view text) {
  const UniqueFd fd(open(file, O_WRONLY | O_CLOEXEC));
  if (!fd.IsOpen() || write(fd.Get(), text.data(), text.size()) < 0) RefuseToEnter(file, errno);
}

std::string OnlyOwnId(unsigned int id) {
  return std::to_string(id) + " " + std::to_string(id) + " 1";
}

// A user namespace in which this user, under the same name, has root's rights over its own files.
void TakeUserNamespace() {
  const unsigned int user = geteuid();
  const unsigned int group = getegid();
  if (unshare(CLONE_NEWUSER | CLONE_NEWNS) != 0) RefuseToEnter("unshare", errno);
  WriteSelf("/proc/self/setgroups", "deny");
  WriteSelf("/proc/self/uid_map", OnlyOwnId(user));
  WriteSelf("/proc/self/gid_map", OnlyOwnId(group));
}

// Mounts made from here on are seen by nobody else.
void TakeMountNamespace() {
  if (unshare(CLONE_NEWNS) != 0) {
    if (errno != EPERM) RefuseToEnter("unshare", errno);
    TakeUserNamespace();
  }
  if (mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0) return;
  if (errno != EINVAL) RefuseToEnter("mount", errno);
  // The kernel changes what others see of a mount by the place of that mount alone.
  throw HostError(
      "the host cannot be entered: a directory outside it is to be visible in it, and the root "
      "directory of this process is no mount point, as in a plain chroot; \"mount --bind DIR DIR\" "
      "before \"chroot DIR\" makes it one");
}

std::vector<VisibleTree> TakeHoldOf(const std::vector<std::string>& paths) {
  std::vector<VisibleTree> trees;
  for (const std::string& path : paths) {
    UniqueFd tree(
        open_tree(AT_FDCWD, path.c_str(), OPEN_TREE_CLONE | OPEN_TREE_CLOEXEC | AT_RECURSIVE));
    if (!tree.IsOpen()) throw SystemFailure(path, "made visible in the host", errno);
    trees.push_back({path, std::move(tree)});
  }
  return trees;
}

bool IsSameFile(int one, int other) {
  struct stat first {};
  struct stat second {};
  return fstat(one, &first) == 0 && fstat(other, &second) == 0 && first.st_dev == second.st_dev &&
         first.st_ino == second.st_ino;
}

// The descriptor belongs to the mounts of before; nothing can be mounted below it. So the directory
// is opened once more, by its path, in the namespace that the process has now.
UniqueFd Reopen(const DirectoryRef& root) {
  UniqueFd fd(open(root.path.c_str(), O_PATH | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC));
  if (!fd.IsOpen()) throw SystemFailure(root.path, "opened", errno);
  if (!IsSameFile(fd.Get(), root.fd)) {
    throw HostError(root.path + ": was exchanged while the host was being entered");
  }
  return fd;
}

void ChangeTo(const UniqueFd& root) {
  if (fchdir(root.Get()) != 0) RefuseToEnter("fchdir", errno);
  if (chroot(".") == 0) return;
  if (errno != EPERM) RefuseToEnter("chroot", errno);
  TakeUserNamespace();
  if (chroot(".") != 0) RefuseToEnter("chroot", errno);
}

// Inside the new root, where no link can lead out of it.
void PutInPlace(const VisibleTree& visible) {
  std::error_code error;
  std::filesystem::create_directories(visible.path, error);
  if (error) throw SystemFailure(visible.path, "made in the host's root", error.value());
  const UniqueFd place(open(visible.path.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
  if (!place.IsOpen()) throw SystemFailure(visible.path, "made visible in the host", errno);
  if (move_mount(visible.tree.Get(), "", place.Get(), "",
                 MOVE_MOUNT_F_EMPTY_PATH | MOVE_MOUNT_T_EMPTY_PATH) != 0) {
    throw SystemFailure(visible.path, "made visible in the host", errno);
  }
}

}  // namespace

void ChangeRoot(const DirectoryRef& root, const std::vector<std::string>& visible) {
  if (!visible.empty()) TakeMountNamespace();
  const std::vector<VisibleTree> trees = TakeHoldOf(visible);
  ChangeTo(Reopen(root));
  for (const VisibleTree& tree : trees) PutInPlace(tree);
}

}  // namespace StandIn
