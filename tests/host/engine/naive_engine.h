// The engine's rules written down once more, as a walk over a list of rules, for comparison.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "host/module/rule.h"

namespace StandIn::Naive {

struct PlainRule {
  RuleType type;
  std::vector<std::string> words;
  bool isGranted = false;
  std::string letters;  // of path rules
};
// In the order in which they are set; the number of a rule is its index.
using PlainRules = std::vector<PlainRule>;

struct Outcome {
  bool isGranted = false;
  std::optional<std::size_t> rule;
  std::string result;  // the domain or label that the operation ends with; empty for none
};

Outcome Access(const PlainRules& rules, const std::string& access, const std::string& path,
               const std::optional<std::string>& label);
Outcome Creation(const PlainRules& rules, const std::string& fileType, const std::string& path,
                 const std::optional<std::string>& label);
Outcome Capability(const PlainRules& rules, const std::string& capability,
                   const std::optional<std::string>& parameter);
Outcome Exec(const PlainRules& rules, const std::string& path,
             const std::optional<std::string>& label);
Outcome Fork(const PlainRules& rules, const std::optional<std::string>& label);
// Of system calls and sockets.
Outcome ByWords(const PlainRules& rules, RuleType type, const std::vector<std::string>& words);

}  // namespace StandIn::Naive
