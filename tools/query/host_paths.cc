#include "tools/query/host_paths.h"

#include <fcntl.h>
#include <linux/openat2.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cstdint>
#include <filesystem>

#include "tools/policy/held_policy.h"

namespace SecPolicyTool {

using StandIn::HostDirectory;
using StandIn::UniqueFd;

namespace {

namespace fs = std::filesystem;

// Opens `path` as if `rootFd` were the root directory.
UniqueFd OpenInRoot(int rootFd, const std::string& path, std::uint64_t flags) {
  struct open_how how {};
  how.flags = flags | O_CLOEXEC;
  how.resolve = RESOLVE_IN_ROOT | RESOLVE_NO_MAGICLINKS;
  // The C library has no function for this call.
  return UniqueFd(static_cast<int>(::syscall(SYS_openat2, rootFd, path.c_str(), &how, sizeof how)));
}

// Where an open file lies; empty when that cannot be told.
std::string PathOf(const UniqueFd& file) {
  std::error_code error;
  return fs::read_symlink("/proc/self/fd/" + std::to_string(file.Get()), error).string();
}

}  // namespace

HostPaths::HostPaths(const HostDirectory& host)
    : root_(openat(host.Descriptor(), StandIn::kRootDirectory,
                   O_PATH | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC)) {}

std::string HostPaths::Resolve(const std::string& path) const {
  const UniqueFd file = OpenInRoot(root_.Get(), path, O_PATH);
  if (file.Get() < 0) return path;
  const std::string root = PathOf(root_);
  const std::string found = PathOf(file);
  if (root.empty() || !found.starts_with(root)) return path;
  const std::string inside = found.substr(root.size());
  return inside.empty() ? "/" : inside;
}

bool HostPaths::OpensDirectory(const std::string& path) const {
  return OpenInRoot(root_.Get(), path, O_RDONLY | O_DIRECTORY).Get() >= 0;
}

std::vector<std::string> LabelablePaths(const HostDirectory& host) {
  std::vector<std::string> paths{"/", StandIn::kArchivesPath};
  const std::string root = host.Path() + "/" + StandIn::kRootDirectory;
  for (const StandIn::TardiskContent& tardisk : ImageOf(host).tardisks) {
    for (const std::string& path : tardisk.paths) {
      std::error_code error;
      const fs::file_type type = fs::symlink_status(root + path, error).type();
      if (type != fs::file_type::symlink && type != fs::file_type::socket) paths.push_back(path);
    }
  }
  return paths;
}

}  // namespace SecPolicyTool
