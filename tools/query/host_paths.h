// Files of a host, without entering it.
#pragma once

#include <string>
#include <vector>

#include "host/root/file_tree.h"
#include "host/state/host_directory.h"

namespace SecPolicyTool {

// Resolves paths as the kernel of a host resolves those of path rules.
class HostPaths {
 public:
  // A host that has not been assembled has no files.
  explicit HostPaths(const StandIn::HostDirectory& host);

  // `path`, which begins with "/", with its links and dots followed within the host's root file
  // system. A path that does not lead to a file stays as it is: so does that of a rule.
  [[nodiscard]] std::string Resolve(const std::string& path) const {
    return root_.ResolvedOrSame(path);
  }

  // Whether `path` leads to something there.
  [[nodiscard]] bool Exists(const std::string& path) const { return root_.Exists(path); }

 private:
  StandIn::FileTree root_;
};

// The paths of the host's files that a file label for a directory and everything below it would
// label: neither symbolic links nor sockets. In no particular order. Throws HostError.
std::vector<std::string> LabelablePaths(const StandIn::HostDirectory& host);

}  // namespace SecPolicyTool
