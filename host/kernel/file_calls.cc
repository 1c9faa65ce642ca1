#include "host/kernel/file_calls.h"

#include <algorithm>
#include <cstring>

#include "platform/private_calls.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

namespace {

[[noreturn]] void RefuseToResolve(const std::string& path, int number) {
  throw ModuleError(number, StrCat("\"", path, "\" cannot be resolved: ", std::strerror(number)));
}

// Whether `path`, which holds no links, is one of the directories made visible, or below one.
bool IsMadeVisible(const AttachedHost& host, const std::string& path) {
  return std::any_of(host.visible.begin(), host.visible.end(), [&](const std::string& dir) {
    return path == dir || path.starts_with(dir + "/");
  });
}

}  // namespace

std::string ResolvedPath(const AttachedHost& host, const CallerFiles& files,
                         const std::string& path) {
  return host.point.Pass(
      Operation::kResolvePath, [&] { return path; },
      [&] {
        auto resolved = files.Resolve(path);
        if (!resolved) RefuseToResolve(path, errno);
        if (resolved->size() >= ZekCtl::Kernel::kPathBytes) RefuseToResolve(path, ENAMETOOLONG);
        return std::move(*resolved);
      });
}

// Beside the files of the image, what is made visible carries a label, since on a machine of its
// own it would lie in the same file system; and so do directories that no archive brought, since
// the host itself makes such for what is to be visible.
std::optional<std::string> LabelledPath(const AttachedHost& host, const CallerFiles& files,
                                        const std::string& path) {
  struct stat status {};
  if (!files.Status(path, status)) throw BadArgument{errno};
  auto inImage = host.files.PathOf(status.st_dev, status.st_ino);
  if (inImage) return inImage;
  auto resolved = files.Resolve(path);
  if (!resolved) throw BadArgument{errno};
  if (S_ISDIR(status.st_mode) || IsMadeVisible(host, *resolved)) return resolved;
  return std::nullopt;
}

}  // namespace StandIn
