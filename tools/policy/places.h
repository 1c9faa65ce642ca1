// Where in its files a loaded policy was decided.
#pragma once

#include "host/image/image_index.h"
#include "tools/policy/policy.h"
#include "tools/policy/policy_files.h"

namespace SecPolicyTool {

// Gives what `policy`, the outcome of a load of `files`, holds the places of the lines that decided
// it; nothing to what no line decided, such as the rule for tardisks without a policy. To be called
// in the host, whose image is `image`. Files that cannot be read give no places.
void AddPlaces(const PolicyFiles& files, const StandIn::ImageIndex& image, Policy& policy);

}  // namespace SecPolicyTool
