#include "tools/query/host_paths.h"

#include <fcntl.h>
#include <sys/stat.h>

#include "host/root/root_index.h"

namespace SecPolicyTool {

using StandIn::HostDirectory;
using StandIn::UniqueFd;

HostPaths::HostPaths(const HostDirectory& host)
    : root_(UniqueFd(openat(host.Descriptor(), StandIn::kRootDirectory,
                            O_PATH | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC))) {}

std::vector<std::string> LabelablePaths(const HostDirectory& host) {
  std::vector<std::string> paths{"/", StandIn::kArchivesPath};
  const auto root = StandIn::RootIndex::Load(host);
  if (!root) return paths;
  for (const StandIn::TardiskContent& tardisk : root->Image().tardisks) {
    for (const std::string& path : tardisk.paths) {
      const mode_t type = root->Tree().LinkType(path);
      if (type != S_IFLNK && type != S_IFSOCK) paths.push_back(path);
    }
  }
  return paths;
}

}  // namespace SecPolicyTool
