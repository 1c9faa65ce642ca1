// Policies for tests, put together by hand.
#pragma once

#include <string>
#include <vector>

#include "tools/policy/policy.h"

namespace SecPolicyTool {

inline PolicyRule SomeRule(RuleType type, const std::vector<std::string>& words,
                           bool isGranted = true) {
  PolicyRule rule;
  rule.key = {type, words, 0};
  rule.isGranted = isGranted;
  return rule;
}

// A "-d" rule on "exec"; its label is "to" + the target unless it is given.
inline PolicyRule Goes(const std::string& target, const std::string& label = "",
                       const std::string& event = "exec") {
  return SomeRule(RuleType::kTransition, {label.empty() ? "to" + target : label, target, event});
}

// A policy of domains with one letter each; "ab" is a transition from a to b.
inline Policy PolicyOfLinks(const std::vector<std::string>& links) {
  Policy policy;
  for (const std::string& link : links) {
    policy.domains[link.substr(0, 1)].rules.push_back(Goes(link.substr(1)));
    policy.domains[link.substr(1)];
  }
  return policy;
}

}  // namespace SecPolicyTool
