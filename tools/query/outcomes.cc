#include "tools/query/outcomes.h"

namespace SecPolicyTool {

std::vector<Outcome> Judge(const Policy& policy, const std::vector<Statement>& statements) {
  Ways ways(policy);
  const Decisions decisions(policy);
  std::vector<Outcome> outcomes;
  for (const Statement& each : statements) {
    Outcome outcome;
    if (each.kind == StatementKind::kMay || each.kind == StatementKind::kNever) {
      outcome.answer = decisions.Decide(each.domain, each.question);
      outcome.holds = outcome.answer.isAllowed == (each.kind == StatementKind::kMay);
    } else {
      outcome.way = ways.Shortest(each.domain, each.target, each.event);
      outcome.holds = outcome.way.has_value() == (each.kind == StatementKind::kReaches);
    }
    outcomes.push_back(std::move(outcome));
  }
  return outcomes;
}

TerminalText OutcomeText(const Statement& statement, const Outcome& outcome) {
  if (statement.target.empty()) return AnswerText(statement.question, outcome.answer);
  if (!outcome.way) return "no way";
  if (outcome.way->empty()) return "the same domain";
  TerminalText text;
  for (const Step& step : *outcome.way) {
    text += (text == "" ? "" : ", ") + *step.from + " -> " + step.rule->key.words[1] + ": " +
            RuleText(*step.rule);
  }
  return text;
}

}  // namespace SecPolicyTool
