// Rules in the JSON that programs read.
#pragma once

#include <nlohmann/json_fwd.hpp>

#include "tools/policy/policy.h"

namespace SecPolicyTool {

// {"type": "-s", "words": ["open"], "decision": "grant", "line": "-s open grant",
//  "place": {"file": ..., "line": ..., "column": ...}}
//
// A path rule has "permission", such as "rw" or "", instead of "decision", and "world" when it is
// for one alone. "place" lacks what is not known, and is absent when nothing is.
nlohmann::json RuleJson(const PolicyRule& rule);

// The same; null for no rule.
nlohmann::json RuleJson(const PolicyRule* rule);

// Adds the member "place" to `entry`, unless nothing of it is known.
void AddPlaceJson(const std::optional<Place>& place, nlohmann::json& entry);

}  // namespace SecPolicyTool
