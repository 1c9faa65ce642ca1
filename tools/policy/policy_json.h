// A policy as JSON, to be carried from one process to another. Its strings hold the bytes as they
// are, so its form for people needs them made printable first.
#pragma once

#include <nlohmann/json_fwd.hpp>

#include "tools/policy/policy.h"

namespace SecPolicyTool {

nlohmann::json ToJson(const Policy& policy);

// The policy that ToJson made this of.
Policy PolicyOfJson(const nlohmann::json& content);

// A place as {"file": ..., "line": ..., "column": ...}, without what is not known; null for none.
nlohmann::json ToJson(const std::optional<Place>& place);
std::optional<Place> PlaceOfJson(const nlohmann::json& entry);

}  // namespace SecPolicyTool
