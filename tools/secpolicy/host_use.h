// A process of the command that has become one of a host.
#pragma once

#include <memory>

#include "host/image/session.h"

namespace SecPolicyTool {

// Enters the host `dir` (see OpenHost); for the rest of the process. What the library logs goes to
// the system log.
std::unique_ptr<StandIn::Session> EnterHost(const std::string& dir,
                                            const StandIn::SessionOptions& options = {});

}  // namespace SecPolicyTool
