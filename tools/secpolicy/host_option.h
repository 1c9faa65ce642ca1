// The host that a verb works on.
#pragma once

#include <CLI/CLI.hpp>
#include <string>

#include "host/image/host_directory.h"

namespace SecPolicyTool {

// Adds "--host DIR" to a verb.
void AddHostOption(CLI::App& verb, std::string& dir);

// Adds "--json" to a verb, whose form docs/schemas/VERB.schema.json describes.
void AddJsonOption(CLI::App& verb, bool& isJson);

// The host directory `dir`; when that is empty, the user's own one, which is made, with the default
// description and no tardisks, when it is not there yet: "secpolicy/host" below $XDG_STATE_HOME, or
// below ~/.local/state. Throws StandIn::HostError.
StandIn::HostDirectory OpenHost(const std::string& dir);

}  // namespace SecPolicyTool
