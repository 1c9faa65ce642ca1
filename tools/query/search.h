// Finding rules.
#pragma once

#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "tools/policy/policy.h"
#include "tools/policy/terminal.h"

namespace SecPolicyTool {

// What is looked for; what is not given does not matter.
struct SearchTerms {
  std::optional<std::string> domain;
  std::optional<RuleType> type;
  // Whether a word of a rule will do; one of them has to.
  std::function<bool(const std::string&)> word;
  // A normal path. Looked for are the path rules that say what holds for it and below it: of each
  // domain, and of each of its worlds, the one that decides on it, and all below it.
  std::optional<std::string> path;
  // Whether it grants; a path rule does when it has a permission at all.
  std::optional<bool> isGranted;
};

// Both live as long as the policy.
struct FoundRule {
  const std::string* domain = nullptr;
  const PolicyRule* rule = nullptr;
};

// The rules for which all terms hold: by domain, and in its order.
std::vector<FoundRule> Search(const Policy& policy, const SearchTerms& terms);

// "FILE:LINE: RULE", or "DOMAIN: RULE" when its file is not known.
TerminalText FoundText(const FoundRule& found);

// The type that a person means: by its keyword, with or without the "-"; by its name; or by
// its short name. Nothing for anything else.
std::optional<RuleType> TypeNamed(const std::string& name);

}  // namespace SecPolicyTool
