// The permission of a path rule.
#pragma once

#include <string>

namespace SecPolicyTool {

// Why a load refuses these letters, in its words; empty when it takes them.
std::string PermissionProblem(const std::string& letters);

}  // namespace SecPolicyTool
