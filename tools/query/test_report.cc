#include "tools/query/test_report.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <ostream>

#include "tools/query/rule_json.h"

namespace SecPolicyTool {

using nlohmann::json;

namespace {

TerminalText PlaceOf(const TestRun& run, const Statement& statement) {
  return run.file + ":" + std::to_string(statement.line);
}

json WayJson(const std::vector<Step>& way) {
  json steps = json::array();
  for (const Step& step : way) {
    steps.push_back({{"from", *step.from}, {"rule", RuleJson(*step.rule)}});
  }
  return steps;
}

}  // namespace

std::size_t TestRun::Failed() const {
  return static_cast<std::size_t>(std::count_if(
      outcomes.begin(), outcomes.end(), [](const Outcome& outcome) { return !outcome.holds; }));
}

void PrintText(const TestRun& run, const Painter& painter, std::ostream& out) {
  for (std::size_t i = 0; i < run.statements.size(); ++i) {
    const Statement& statement = run.statements[i];
    if (run.outcomes[i].holds) continue;
    out << PlaceOf(run, statement) << ": " << painter.Paint(Colour::kRed, "expected") << " \""
        << (statement.text + "\", but " + OutcomeText(statement, run.outcomes[i])).EndLine();
  }
  const std::string summary = std::to_string(run.statements.size()) + " statements, " +
                              std::to_string(run.Failed()) + " failed";
  out << painter.Paint(run.Failed() == 0 ? Colour::kGreen : Colour::kRed, summary) << "\n";
}

void PrintTap(const TestRun& run, std::ostream& out) {
  out << "TAP version 13\n1.." << run.statements.size() << "\n";
  for (std::size_t i = 0; i < run.statements.size(); ++i) {
    const Statement& statement = run.statements[i];
    out << (run.outcomes[i].holds ? "ok " : "not ok ") << i + 1 << " - "
        << TerminalText(statement.text).EndLine();
    if (run.outcomes[i].holds) continue;
    out << ("# " + PlaceOf(run, statement) + ": " + OutcomeText(statement, run.outcomes[i]))
               .EndLine();
  }
}

json TestJson(const TestRun& run) {
  json results = json::array();
  for (std::size_t i = 0; i < run.statements.size(); ++i) {
    const Statement& statement = run.statements[i];
    const Outcome& outcome = run.outcomes[i];
    json result{{"line", statement.line}, {"statement", statement.text}, {"holds", outcome.holds}};
    if (statement.target.empty()) {
      result["allowed"] = outcome.answer.isAllowed;
      result["rule"] = RuleJson(outcome.answer.rule);
    } else {
      result["way"] = outcome.way ? WayJson(*outcome.way) : json();
    }
    results.push_back(std::move(result));
  }
  return {{"file", run.file},
          {"policy", run.policy},
          {"statements", run.statements.size()},
          {"failed", run.Failed()},
          {"results", std::move(results)}};
}

}  // namespace SecPolicyTool
