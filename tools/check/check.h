// Everything that can be said about a policy directory before it is loaded.
#pragma once

#include <string>
#include <vector>

#include "host/state/host_directory.h"
#include "tools/check/finding.h"

namespace SecPolicyTool {

struct CheckReport {
  std::vector<Finding> findings;
  std::size_t files = 0;  // how many policy files were looked at, the host's for tardisks included
};

// All findings in the policy directory `dir` (the host's own one when it is empty), judged by a
// host whose kernel has just been started: in the order of files and lines, those without a place
// last. Places name files as `dir` does. Throws as ReadSource does.
CheckReport CheckWholePolicy(StandIn::HostDirectory host, const std::string& dir);

// Its findings alone.
std::vector<Finding> CheckPolicy(StandIn::HostDirectory host, const std::string& dir);

}  // namespace SecPolicyTool
