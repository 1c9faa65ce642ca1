// Findings as JSON, to be carried from one process to another. Its strings hold the bytes as they
// are.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <vector>

#include "tools/check/finding.h"

namespace SecPolicyTool {

nlohmann::json ToJson(std::vector<Finding> findings);

// The findings that ToJson made these of.
std::vector<Finding> FindingsOfJson(nlohmann::json entries);

}  // namespace SecPolicyTool
