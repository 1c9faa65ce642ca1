// The one transition event that a verb is asked about.
#pragma once

#include <optional>
#include <string>

#include "tools/command_line/command_line.h"

namespace SecPolicyTool {

// "--event EVENT".
CommandOption EventOption(std::optional<std::string>& event);

// Throws std::runtime_error `unknown transition event "EVENT"`, with the nearest one where there is
// one, when the host's kernel knows no such event, and as OpenHost does.
void RequireEvent(const std::string& host, const std::optional<std::string>& event);

}  // namespace SecPolicyTool
