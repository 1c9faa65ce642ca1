// The shape that domain files and tardisk files share: a rule type, then its words.
#pragma once

#include <queue>
#include <string>

#include "secpolicy/secpolicy.h"

namespace SecPolicy {

// Reads `file` and hands each line that has words to `addRule(ruleSet, line, args)`, in ascending
// order: the entry of `ruleSets` that the first word names, and the other words. The first
// exception ends it. Throws ParseFile's text; for a rule type that is not in `ruleSets` the parse
// error of `subject` with `unknownType` + type + ")".
template <typename RuleSets, typename AddRule>
void ForEachRuleLine(const std::string& file, const std::string& subject, const char* unknownType,
                     RuleSets& ruleSets, AddRule addRule) {
  std::map<unsigned int, std::queue<std::string>> lines;
  ParseFile(file, lines);
  for (auto& [line, words] : lines) {
    const std::string type = words.front();
    words.pop();
    const auto ruleSet = ruleSets.find(type);
    if (ruleSet == ruleSets.end()) ThrowDomainParseError(line, subject, unknownType + type + ")");
    addRule(*ruleSet->second, line, words);
  }
}

}  // namespace SecPolicy
