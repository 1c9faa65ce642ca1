#include "tests/host/engine/naive_engine.h"

namespace StandIn::Naive {

namespace {

// The rule that is in force for the words of the one at `index`: the last with the same words.
std::size_t InForce(const PlainRules& rules, std::size_t index) {
  std::size_t last = index;
  for (std::size_t i = index; i < rules.size(); ++i) {
    if (rules[i].type == rules[index].type && rules[i].words == rules[index].words) last = i;
  }
  return last;
}

bool IsAbove(const std::string& directory, const std::string& path) {
  return directory == path || directory == "/" || path.find(directory + "/") == 0;
}

std::string LettersFor(const std::string& access) {
  if (access == "read" || access == "getattr") return "r";
  if (access == "exec") return "x";
  if (access == "connect") return "";
  return "w";
}

// The result of the first rule for the two other words that is granted.
Outcome FirstGranted(const PlainRules& rules, RuleType type,
                     const std::optional<std::string>& label, const std::string& word) {
  Outcome first;
  for (std::size_t i = 0; i < rules.size(); ++i) {
    const PlainRule& rule = rules[i];
    if (rule.type != type || rule.words[0] != label || rule.words[2] != word) continue;
    const std::size_t held = InForce(rules, i);
    if (rules[held].isGranted) return {true, held, rule.words[1]};
    if (!first.rule) first.rule = held;
  }
  return first;
}

}  // namespace

Outcome ByWords(const PlainRules& rules, RuleType type, const std::vector<std::string>& words) {
  for (std::size_t i = rules.size(); i-- > 0;) {
    if (rules[i].type == type && rules[i].words == words) return {rules[i].isGranted, i, ""};
  }
  return {};
}

Outcome Access(const PlainRules& rules, const std::string& access, const std::string& path,
               const std::optional<std::string>& label) {
  std::optional<std::size_t> best;
  for (std::size_t i = 0; i < rules.size(); ++i) {
    if (rules[i].type != RuleType::kPath || !IsAbove(rules[i].words[0], path)) continue;
    if (!best || rules[i].words[0].size() >= rules[*best].words[0].size()) best = i;
  }
  const std::string letter = LettersFor(access);
  if (best && !letter.empty()) {
    return {rules[*best].letters.find(letter) != std::string::npos, best, ""};
  }
  if (!label) return {};
  return ByWords(rules, RuleType::kObjectAccess, {*label, access});
}

Outcome Creation(const PlainRules& rules, const std::string& fileType, const std::string& path,
                 const std::optional<std::string>& label) {
  const Outcome access = Access(rules, "create", path, label);
  return access.isGranted ? FirstGranted(rules, RuleType::kFileCreation, label, fileType) : access;
}

Outcome Capability(const PlainRules& rules, const std::string& capability,
                   const std::optional<std::string>& parameter) {
  if (parameter) {
    const Outcome exact = ByWords(rules, RuleType::kCapabilityParam, {capability, *parameter});
    if (exact.rule) return exact;
  }
  return ByWords(rules, RuleType::kCapability, {capability});
}

Outcome Exec(const PlainRules& rules, const std::string& path,
             const std::optional<std::string>& label) {
  Outcome access = Access(rules, "exec", path, label);
  if (access.isGranted) {
    access.result = FirstGranted(rules, RuleType::kTransition, label, "exec").result;
  }
  return access;
}

Outcome Fork(const PlainRules& rules, const std::optional<std::string>& label) {
  return {true, std::nullopt, FirstGranted(rules, RuleType::kTransition, label, "fork").result};
}

}  // namespace StandIn::Naive
