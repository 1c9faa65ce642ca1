// A load that a host keeps as a whole.
#pragma once

#include "host/doors/library_use.h"
#include "tools/policy/policy_path.h"

namespace SecPolicyTool {

// Loads `policy` in a batch of `kernel`, which the caller commits, also when the load failed or was
// terminated: a kernel keeps what was installed before. What the library says, and why a load ended
// early, goes to `output`. Throws StandIn::HostError, nothing done, when the host's lock cannot be
// had.
StandIn::LoadEnd LoadInBatch(const PolicyPath& policy, StandIn::Kernel& kernel,
                             StandIn::LibraryOutput& output);

}  // namespace SecPolicyTool
