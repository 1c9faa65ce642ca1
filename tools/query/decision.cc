#include "tools/query/decision.h"

#include "tools/query/paths.h"

namespace SecPolicyTool {

DomainDecisions::DomainDecisions(const DomainContent& domain) {
  for (const PolicyRule& rule : domain.rules) {
    if (rule.key.world != 0) continue;
    RuleKey key = rule.key;
    if (key.type == RuleType::kPath) key.words[0] = NormalPath(key.words[0]);
    rules_[std::move(key)] = &rule;
  }
}

const PolicyRule* DomainDecisions::Find(const RuleKey& key) const {
  const auto rule = rules_.find(key);
  return rule == rules_.end() ? nullptr : rule->second;
}

const PolicyRule* DomainDecisions::FindAbove(const std::string& path) const {
  std::vector<std::string> paths = WithParents(path);
  for (; !paths.empty(); paths.pop_back()) {
    if (const PolicyRule* rule = Find({RuleType::kPath, {paths.back()}, 0})) return rule;
  }
  return nullptr;
}

Answer DomainDecisions::Decide(const Question& question) const {
  const bool isPath = question.key.type == RuleType::kPath;
  const PolicyRule* rule = isPath ? FindAbove(question.key.words[0]) : Find(question.key);
  if (rule == nullptr) return {};
  return {isPath ? (rule->permission & question.permission) != 0 : rule->isGranted, rule};
}

Decisions::Decisions(const Policy& policy) {
  for (const auto& [name, domain] : policy.domains) domains_.emplace(name, domain);
}

Answer Decisions::Decide(const std::string& domain, const Question& question) const {
  return domains_.at(domain).Decide(question);
}

Answer Decide(const Policy& policy, const std::string& domain, const Question& question) {
  return DomainDecisions(policy.domains.at(domain)).Decide(question);
}

TerminalText RuleText(const PolicyRule& rule) {
  const std::string line = LineOf(rule);
  return rule.place ? line + " (" + PlaceText(rule.place) + ")" : line;
}

TerminalText AnswerText(const Answer& answer) {
  const TerminalText decision = answer.isAllowed ? "yes: " : "no: ";
  return decision + (answer.rule == nullptr ? "no rule" : RuleText(*answer.rule));
}

}  // namespace SecPolicyTool
