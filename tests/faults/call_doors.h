// The trapped system calls, on their way to the host that answers them.
#pragma once

namespace SecPolicyFaults {

// From here on, for the rest of this process's life; it must have entered a host.
void WatchCalls();

}  // namespace SecPolicyFaults
