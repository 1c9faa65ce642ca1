// A load that changes nothing.
#pragma once

#include "host/image/session.h"
#include "tools/policy/policy_path.h"

namespace SecPolicyTool {

// What a session in which `dir` is to be tried is entered with: a kernel that has just been started
// and is forgotten.
StandIn::SessionOptions TrialOptions(const PolicyPath& dir);

// LoadPolicy in such a session. Its errors go to standard error, and nothing to the system log: the
// host's policy has not been set. Throws "there is no policy directory DIR"; what the library
// throws is reported instead. The process is terminated as by LoadPolicy.
void LoadOnTrial(const PolicyPath& dir);

}  // namespace SecPolicyTool
