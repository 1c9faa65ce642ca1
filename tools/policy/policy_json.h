// Parts of policies as JSON.
#pragma once

#include <nlohmann/json_fwd.hpp>

#include "tools/policy/policy.h"

namespace SecPolicyTool {

// A place as {"file": ..., "line": ..., "column": ...}, without what is not known; null for none.
// Its string holds the bytes as they are, so its form for people needs them made printable first.
nlohmann::json ToJson(const std::optional<Place>& place);

}  // namespace SecPolicyTool
