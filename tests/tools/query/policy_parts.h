// Policies that tests put together.
#pragma once

#include <initializer_list>
#include <string>

#include "tools/policy/policy.h"
#include "tools/policy/policy_text.h"

namespace SecPolicyTool {

// The rule that a line of a policy file says, which stands at that line of the file "policy".
inline PolicyRule RuleOf(const std::string& text, unsigned int line = 0) {
  std::vector<std::string> words;
  for (const LineWord& word : WordsOf(text)) words.push_back(word.text);
  PolicyRule rule;
  rule.key.type = TypeOfKeyword(words.at(0)).value();
  const std::size_t count = InfoOf(rule.key.type).wordCount;
  for (std::size_t i = 1; i <= count; ++i) rule.key.words.push_back(words.at(i));
  const std::string decision = words.size() > count + 1 ? words.back() : "";
  rule.isGranted = decision == "grant";
  if (rule.key.type == RuleType::kPath) {
    for (const StandIn::PermissionBit& each : StandIn::kPermissionBits) {
      if (decision.find(each.letter) != std::string::npos) rule.permission |= each.bit;
    }
  }
  if (line != 0) rule.place = Place{"policy", line, 1};
  return rule;
}

// A domain with the rules that these lines say.
inline DomainContent DomainWith(std::initializer_list<const char*> lines) {
  DomainContent domain;
  for (const char* line : lines) {
    const auto number = static_cast<unsigned int>(domain.rules.size() + 1);
    domain.rules.push_back(RuleOf(line, number));
  }
  return domain;
}

}  // namespace SecPolicyTool
