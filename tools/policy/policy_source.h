// Where a verb takes a policy from.
#pragma once

#include <string>
#include <vector>

#include "host/state/host_directory.h"
#include "tools/policy/policy.h"

namespace SecPolicyTool {

// The source that is what a host's kernel holds. A directory of that name is "./kernel".
inline constexpr char kKernelSource[] = "kernel";

struct SourcePolicy {
  Policy policy;
  // Of a directory: what a load of it reports, in order, a text for each message.
  std::vector<std::string> errors;
  bool isTerminated = false;  // a load of it is terminated before its end
};

// The policy of `source`: kKernelSource, a policy directory, or the host's own one when it is
// empty.
//
// A directory means what a kernel that has just been started holds once it was loaded: the load is
// tried with such a kernel in this process's memory, and nothing of it is kept. Places name files
// as `source` does. Those of the kernel have lines only.
//
// Throws StandIn::HostError when the host is damaged or has not been assembled, and
// std::runtime_error "there is no policy directory DIR".
SourcePolicy ReadSource(StandIn::HostDirectory host, const std::string& source);

}  // namespace SecPolicyTool
