// Findings as JSON, to be carried from one process to another on the same machine; not for anyone
// to read. Texts keep their bytes as they are.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <vector>

#include "tools/check/finding.h"

namespace SecPolicyTool {

nlohmann::json ToJson(const std::vector<Finding>& findings);

// The findings that ToJson made these of.
std::vector<Finding> FindingsOfJson(const nlohmann::json& content);

}  // namespace SecPolicyTool
