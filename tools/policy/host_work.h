// Work in a host, done by a process of its own.
#pragma once

#include <functional>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "host/image/session.h"

namespace SecPolicyTool {

// What a piece of work gave.
struct HostWork {
  nlohmann::json result;
  std::vector<std::string> errors;  // what it wrote to standard error, an entry for each message
  bool wasTerminated = false;       // by the library, since a domain that the host needs is missing
};

// Enters `host` in a forked child, runs `before` and then `work` there, and brings what `work`
// returns back. Its strings may hold any bytes. When `before` ends the process as LoadPolicy does
// when it terminates, `work` still runs.
//
// Messages are what stands behind "Error: " on standard error, as ReportError and the library write
// it. What `work` throws, and a host that cannot be entered, is thrown here again as
// std::runtime_error of the same text; so is "the work in the host was killed (SIGNAL)".
HostWork WorkInHost(StandIn::HostDirectory host, StandIn::SessionOptions options,
                    const std::function<void(StandIn::Session&)>& before,
                    const std::function<nlohmann::json(StandIn::Session&)>& work);

}  // namespace SecPolicyTool
