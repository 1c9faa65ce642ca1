// File rules as the kernel exchanges them.
#pragma once

#include <string>
#include <vector>

#include "secpolicy/secpolicy.h"

namespace SecPolicyTest {

inline SecPolicy::ZekAccess_FileRule FileRule(const std::string& path, std::uint32_t permission) {
  SecPolicy::ZekAccess_FileRule rule{};
  path.copy(rule.path, sizeof rule.path - 1);
  rule.permission = permission;
  return rule;
}

// "PATH PERMISSION", joined by ", ".
inline std::string TextOf(const std::vector<SecPolicy::ZekAccess_FileRule>& rules) {
  std::string text;
  for (const SecPolicy::ZekAccess_FileRule& rule : rules) {
    text +=
        (text.empty() ? "" : ", ") + std::string(rule.path) + " " + std::to_string(rule.permission);
  }
  return text;
}

// Counts, allocates and reads.
inline std::string RulesHeldBy(unsigned int domain) {
  std::vector<SecPolicy::ZekAccess_FileRule> rules(SecPolicy::RetrieveNumberOfFilePolicies(domain));
  SecPolicy::RetrieveFilePolicies(domain, rules.data(), static_cast<unsigned int>(rules.size()));
  return TextOf(rules);
}

}  // namespace SecPolicyTest
