#include "tools/query/decision.h"

#include "host/engine/accesses.h"
#include "host/engine/engine.h"

namespace SecPolicyTool {

DomainDecisions::DomainDecisions(const DomainContent& domain) : content_(domain) {
  for (std::size_t number = 0; number < domain.rules.size(); ++number) {
    const PolicyRule& rule = domain.rules[number];
    if (rule.key.world != 0) continue;
    rules_.Add(rule.key.type, {rule.key.words.begin(), rule.key.words.end()},
               {rule.isGranted, rule.permission, number});
  }
}

const PolicyRule* DomainDecisions::RuleOf(std::optional<std::size_t> number) const {
  return number ? &content_.rules[*number] : nullptr;
}

Answer DomainDecisions::DecideOnFile(const AskedFile& file) const {
  const StandIn::Subject subject{rules_};
  if (file.access == StandIn::kExecAccess) {
    const auto verdict = StandIn::DecideExec(subject, file.object);
    return {verdict.isAllowed, RuleOf(verdict.rule), RuleOf(verdict.transition)};
  }
  const auto verdict = StandIn::DecideAccess(subject, file.access, file.object);
  return {verdict.isAllowed, RuleOf(verdict.rule)};
}

Answer DomainDecisions::Decide(const Question& question) const {
  if (question.file) return DecideOnFile(*question.file);
  const StandIn::NumberedRule* const rule =
      rules_.Find(question.key.type, {question.key.words.begin(), question.key.words.end()});
  if (rule == nullptr) return {};
  return {rule->isGranted, RuleOf(rule->number)};
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

namespace {

TerminalText NoRuleText(const Question& question) {
  if (!question.file) return "no rule";
  const auto& label = question.file->object.label;
  return label ? "no rule for the path or the label " + *label : "no rule for the path";
}

}  // namespace

TerminalText AnswerText(const Question& question, const Answer& answer) {
  TerminalText text = answer.isAllowed ? "yes: " : "no: ";
  text += answer.rule == nullptr ? NoRuleText(question) : RuleText(*answer.rule);
  if (answer.transition != nullptr) {
    text += "; continues in " + answer.transition->key.words.at(1) + ": " +
            RuleText(*answer.transition);
  }
  return text;
}

}  // namespace SecPolicyTool
