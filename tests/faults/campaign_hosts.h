// The hosts on which the campaign runs.
#pragma once

#include <string>

#include "tests/faults/scenario.h"

namespace SecPolicyFaults {

// Where the policy of a host lies, within it.
std::string PolicyDirOf(HostKind kind);

// Makes a host of this kind in the directory `dir`, which does not exist yet.
void MakeHost(HostKind kind, const std::string& dir);

}  // namespace SecPolicyFaults
