// Where in its files a loaded policy was decided.
#pragma once

#include "host/root/root_index.h"
#include "tools/policy/policy.h"
#include "tools/policy/policy_files.h"

namespace SecPolicyTool {

// Gives what `policy`, the outcome of a load of `files` on a host with the root `root`, holds the
// places of the lines that decided it; nothing to what no line decided, such as the rule for
// tardisks without a policy. Files that cannot be read give no places.
void AddPlaces(const PolicyFiles& files, const StandIn::RootIndex& root, Policy& policy);

}  // namespace SecPolicyTool
