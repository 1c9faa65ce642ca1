// A process of the command that has become one of a host.
#pragma once

#include <memory>

#include "host/image/session.h"

namespace SecPolicyTool {

// Enters the host `dir` (see OpenHost); for the rest of the process. What the library logs goes to
// the system log.
std::unique_ptr<StandIn::Session> EnterHost(const std::string& dir,
                                            const StandIn::SessionOptions& options = {});

// A world of a host: a process id. Throws std::invalid_argument as WholeNumber does.
int WorldId(const std::string& text);

}  // namespace SecPolicyTool
