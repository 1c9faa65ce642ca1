// The policy directory of a load, as the host is to see it.
#pragma once

#include <string>
#include <vector>

#include "tools/policy/policy_files.h"

namespace SecPolicyTool {

struct PolicyPath {
  std::string path;                  // absolute
  std::vector<std::string> visible;  // what has to be made visible in the host for it
  std::string shown;                 // what its user calls it, without slashes at its end

  [[nodiscard]] PolicyFiles Files() const { return {path, shown}; }
};

// Where `dir`, as given on the command line, is: a directory outside the host, which is to be seen
// inside under the same absolute path, or else one that only the host may have. Empty for the
// host's own, kSystemPolicyDir.
PolicyPath LocatePolicy(const std::string& dir);

// Throws std::runtime_error "there is no policy directory DIR". To be called in the host, in which
// the directory may be.
void RequireDirectory(const PolicyPath& policy);

}  // namespace SecPolicyTool
