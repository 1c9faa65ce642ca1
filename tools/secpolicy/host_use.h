// A verb's use of a host's kernel.
#pragma once

#include <functional>
#include <string>

#include "host/kernel/kernel.h"
#include "tools/policy/exit_status.h"

namespace SecPolicyTool {

// What a verb does with a kernel that the library works on. What the library logs goes to the
// system log.
using HostWork = std::function<ExitStatus(StandIn::Kernel&)>;

// Does `work` with what the kernel of the host `dir` (see OpenHost) holds now. Writes nothing.
ExitStatus ReadHost(const std::string& dir, const HostWork& work);

// Does `work` with the host's lock held and keeps what it changed, also when it throws. Throws
// StandIn::HostError, nothing done, when the lock cannot be had.
ExitStatus ChangeHost(const std::string& dir, const StandIn::ChangeOptions& changes,
                      const HostWork& work, const StandIn::KernelOptions& options = {});

// A world of a host: a process id. Throws std::invalid_argument as WholeNumber does.
int WorldId(const std::string& text);

}  // namespace SecPolicyTool
