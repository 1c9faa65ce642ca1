// A process of the command that has become one of a host.
#pragma once

#include <functional>
#include <memory>

#include "host/image/session.h"

namespace SecPolicyTool {

// Enters the host `dir` (see OpenHost); for the rest of the process. What the library logs goes to
// the system log.
std::unique_ptr<StandIn::Session> EnterHost(const std::string& dir,
                                            const StandIn::SessionOptions& options = {},
                                            const StandIn::ChangeOptions& changes = {});

// Calls `change` with the host's lock held, and keeps what it changed, also when it throws. Throws
// StandIn::HostError, nothing called, when the lock cannot be had; a private call could not say
// why.
void ChangeHost(StandIn::Session& session, const std::function<void()>& change);

// A world of a host: a process id. Throws std::invalid_argument as WholeNumber does.
int WorldId(const std::string& text);

}  // namespace SecPolicyTool
