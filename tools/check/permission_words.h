// The permission of a path rule.
#pragma once

#include <string>

namespace SecPolicyTool {

// Why a load refuses these letters, in its words; empty when it takes them. The library does not
// export the function that says so; tests hold the two against each other.
std::string PermissionProblem(const std::string& letters);

}  // namespace SecPolicyTool
