#include "tools/query/rule_json.h"

#include <nlohmann/json.hpp>

#include "tools/policy/policy_json.h"

namespace SecPolicyTool {

using nlohmann::json;

void AddPlaceJson(const std::optional<Place>& place, json& entry) {
  json shown = ToJson(place);
  if (shown.is_null()) return;
  // The kernel knows lines alone.
  if (place->file.empty()) shown.erase("file");
  if (!shown.empty()) entry["place"] = std::move(shown);
}

json RuleJson(const PolicyRule& rule) {
  const RuleTypeInfo& info = InfoOf(rule.key.type);
  json entry{{"type", info.keyword},
             {"words", std::vector<std::string>(rule.key.words.begin(), rule.key.words.end())},
             {info.HasDecision() ? "decision" : "permission", DecisionOf(rule)},
             {"line", LineOf(rule)}};
  if (rule.key.world != 0) entry["world"] = rule.key.world;
  AddPlaceJson(rule.place, entry);
  return entry;
}

json RuleJson(const PolicyRule* rule) { return rule == nullptr ? json() : RuleJson(*rule); }

}  // namespace SecPolicyTool
