// What would be right in place of a wrong rule.
#pragma once

#include <string>

#include "tools/policy/policy.h"

namespace SecPolicyTool {

// The form of a rule with a wrong number of words: "write: -s SYSTEM-CALL grant|revoke".
std::string HelpForCount(const RuleTypeInfo& info);

// For a word that is no rule type: the one that has its letter, whatever else the word has; or else
// all of them.
std::string HelpForType(const std::string& word);

// For a word that is no decision.
std::string HelpForDecision(const std::string& word);

}  // namespace SecPolicyTool
