// The policy directory that a user names.
#pragma once

#include <string>

#include "host/kernel/kernel.h"
#include "tools/policy/policy_files.h"

namespace SecPolicyTool {

struct PolicyPath {
  std::string path;   // absolute
  bool isOnMachine;   // else in the host's root
  std::string shown;  // what its user calls it, without slashes at its end

  // Its files; those of the host are the kernel's.
  [[nodiscard]] PolicyFiles Files(StandIn::Kernel& kernel) const {
    return {isOnMachine ? StandIn::FileTree::Machine() : kernel.Files().Tree(), path, shown};
  }
  // What a use of the library is told; see StandIn::LibraryUse.
  [[nodiscard]] std::string MachinePath() const { return isOnMachine ? path : std::string(); }
};

// Where `dir`, as given on the command line, is: a directory of this machine, or else one that only
// the host may have. Empty for the host's own, kSystemPolicyDir.
PolicyPath LocatePolicy(const std::string& dir);

// Throws std::runtime_error "there is no policy directory DIR".
void RequireDirectory(const PolicyFiles& policy);

}  // namespace SecPolicyTool
