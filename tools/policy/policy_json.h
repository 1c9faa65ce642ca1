// Parts of policies as JSON.
#pragma once

#include <nlohmann/json_fwd.hpp>

#include "tools/policy/policy.h"

namespace SecPolicyTool {

// A place as {"file": ..., "line": ..., "column": ...}, without what is not known; null for none.
nlohmann::json ToJson(const std::optional<Place>& place);

}  // namespace SecPolicyTool
