// What a kernel holds, as a policy.
#pragma once

#include "host/image/host_directory.h"
#include "host/image/image_index.h"
#include "host/module/security_module.h"
#include "tools/policy/policy.h"

namespace SecPolicyTool {

// Everything that `module` holds. Labels are asked for the files of `image` and for its tardisks.
// Keyword rules have the line that they were set from as their place, without a file. Throws what
// the module throws.
Policy HeldPolicy(StandIn::SecurityModule& module, const StandIn::ImageIndex& image);

// What the kernel of a host holds now. Throws HostError when the host is damaged; one that has not
// been assembled has no files.
Policy HeldPolicy(const StandIn::HostDirectory& host);

// The image of a host; an empty one when it has not been assembled. Throws HostError.
StandIn::ImageIndex ImageOf(const StandIn::HostDirectory& host);

}  // namespace SecPolicyTool
