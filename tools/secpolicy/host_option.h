// The host that a verb works on.
#pragma once

#include <string>

#include "host/state/host_directory.h"
#include "tools/command_line/command_line.h"

namespace SecPolicyTool {

// "--host DIR".
CommandOption HostOption(std::string& dir);

// The operand DIR of the verbs that work on host directories themselves.
CommandOption HostOperand(std::string& dir, const std::string& description);

// "--json"; docs/schemas/VERB.schema.json describes what is printed.
CommandOption JsonOption(bool& isJson);

// "--wait SECONDS" and "--trust-other-writers", for a verb that changes a host.
void AddChangeOptions(CommandLine& verb, StandIn::ChangeOptions& changes);

// The host directory `dir`; when that is empty, the user's own one, which is made, with the default
// description and no tardisks, when it is not there yet: "secpolicy/host" below $XDG_STATE_HOME, or
// below ~/.local/state. It is changed as `changes` say. Throws StandIn::HostError.
StandIn::HostDirectory OpenHost(const std::string& dir, const StandIn::ChangeOptions& changes = {});

}  // namespace SecPolicyTool
