// What a kernel holds, as a policy.
#pragma once

#include "host/kernel/kernel.h"
#include "tools/policy/policy.h"

namespace SecPolicyTool {

// Everything that `module` holds. Labels are asked for the files of `image` and for its tardisks.
// Keyword rules have the line that they were set from as their place, without a file. Throws what
// the module throws.
Policy HeldPolicy(StandIn::SecurityModule& module, const StandIn::ImageIndex& image);

// The same of a kernel and its files.
Policy HeldPolicy(StandIn::Kernel& kernel);

// What the kernel of a host holds now. Throws HostError when the host is damaged; one that has not
// been assembled has no files.
Policy HeldPolicy(StandIn::HostDirectory host);

}  // namespace SecPolicyTool
