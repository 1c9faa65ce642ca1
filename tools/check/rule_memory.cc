#include "tools/check/rule_memory.h"

#include <algorithm>

#include "platform/zek_access.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicyTool {

namespace {

using ZekCtl::Security::ZekAccess_CapabilityParamRule;

std::string OnLine(unsigned int line) { return "on line " + std::to_string(line); }

ZekAccess_CapabilityParamRule ParameterRule(const PolicyLine& line, unsigned int number,
                                            const std::string& domain,
                                            const std::string& decision) {
  ZekAccess_CapabilityParamRule rule;
  rule.line = number;
  rule.domainName = domain;
  rule.capability = line.words.at(1).text;
  rule.parameter = line.words.at(2).text;
  rule.grant = decision == "grant";
  return rule;
}

// Letters in one order: "wr" permits what "rw" does.
std::string Sorted(std::string letters) {
  std::sort(letters.begin(), letters.end());
  return letters;
}

bool IsSameDecision(RuleType type, const std::string& a, const std::string& b) {
  return type == RuleType::kPath ? Sorted(a) == Sorted(b) : a == b;
}

// What a rule does to what it decides on: "grants", "permits rw for".
std::string Verb(RuleType type, const std::string& decision) {
  if (type != RuleType::kPath) return decision + "s";
  return "permits " + (decision.empty() ? std::string("nothing") : decision) + " for";
}

}  // namespace

void RuleMemory::AddContradictoryParameter(const GoodRule& rule, const Seen& seen) {
  const std::string text = TextOfRefusal([&] {
    ZekCtl::Security::ZekAccessInterfaceImpl iface;
    iface.CheckCapabilityParamRuleConstraints(
        file_.name, {ParameterRule(*rule.line, seen.firstLine, file_.name, seen.firstDecision),
                     ParameterRule(*rule.line, rule.line->number, file_.name, rule.decision)});
  });
  context_.findings.AddError(
      Kind::kContradictoryParameter, SpotOf(file_, *rule.line, rule.line->words.back()), text,
      "Policy constraint error for domain: " + file_.name + " : " + text,
      "keep one of the two lines; until then none of the domain's rules are installed");
}

void RuleMemory::Compare(const GoodRule& rule, const Seen& seen) {
  if (rule.type == RuleType::kCapabilityParam && rule.decision != seen.firstDecision) {
    AddContradictoryParameter(rule, seen);
    return;
  }
  if (IsSameDecision(rule.type, rule.decision, seen.decision)) {
    context_.findings.AddWarning(Kind::kRepeatedRule, SpotOf(file_, *rule.line),
                                 "the line says what the one " + OnLine(seen.line) + " says",
                                 "remove one of the two");
    return;
  }
  if (rule.type == RuleType::kCapabilityParam) return;  // said of the line between
  context_.findings.AddWarning(
      Kind::kContradictoryRule, SpotOf(file_, *rule.line, rule.line->words.back()),
      "the line " + Verb(rule.type, rule.decision) + " what the one " + OnLine(seen.line) + " " +
          Verb(rule.type, seen.decision) + "; the later one wins",
      "keep the one that is meant");
}

void RuleMemory::Add(const GoodRule& rule) {
  const std::string key = std::string(InfoOf(rule.type).keyword) + " " + rule.words;
  const unsigned int number = rule.line->number;
  const auto [entry, isNew] = seen_.try_emplace(
      key, Seen{rule.type, number, rule.decision, number, rule.decision, rule.line});
  if (isNew) return;
  Compare(rule, entry->second);
  entry->second.line = number;
  entry->second.decision = rule.decision;
}

void RuleMemory::NoteTransitions() const {
  std::set<std::string>& targets = context_.references.transitions[file_.name];
  for (const auto& [key, seen] : seen_) {
    if (seen.type == RuleType::kTransition && seen.decision == "grant") {
      targets.insert(seen.text->words.at(2).text);
    }
  }
}

}  // namespace SecPolicyTool
