#include "tools/policy/policy.h"

#include "host/module/permission_letters.h"

namespace SecPolicyTool {

std::string DecisionOf(const PolicyRule& rule) {
  if (!InfoOf(rule.key.type).HasDecision()) return StandIn::PermissionLetters(rule.permission);
  return rule.isGranted ? "grant" : "revoke";
}

std::string LineOf(const PolicyRule& rule) {
  std::string line = InfoOf(rule.key.type).keyword;
  for (const std::string& word : rule.key.words) line += " " + word;
  const std::string decision = DecisionOf(rule);
  if (!decision.empty()) line += " " + decision;
  if (rule.key.world != 0) line += " # world " + std::to_string(rule.key.world);
  return line;
}

std::string PlaceText(const std::optional<Place>& place) {
  if (!place) return "-";
  std::string text = place->file.Text();
  for (const unsigned int number : {place->line, place->column}) {
    if (number == 0) break;
    text += (text.empty() ? "line " : ":") + std::to_string(number);
  }
  return text;
}

}  // namespace SecPolicyTool
