#include "tools/graph/path_forms.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <stdexcept>

#include "tools/policy/counted.h"
#include "tools/policy/policy_json.h"
#include "tools/policy/unknown_word.h"

namespace SecPolicyTool {

using nlohmann::json;

namespace {

std::string RuleLine(const TransitionGraph& graph, const Transition& transition) {
  PolicyRule rule;
  rule.key = {RuleType::kTransition,
              {transition.label, graph.Domains()[transition.to], transition.event},
              0};
  rule.isGranted = true;
  return LineOf(rule);
}

TerminalText Name(const TransitionGraph& graph, std::size_t domain) {
  return graph.Domains()[domain];
}

// A step's rules, a line for each, aligned among one another.
TerminalText StepText(const TransitionGraph& graph, const Link& link, const Painter& painter) {
  std::size_t width = 0;
  for (const Transition& rule : graph.TransitionsOf(link)) {
    width = std::max(width, TerminalText(RuleLine(graph, rule)).Text().size());
  }
  TerminalText text = "   " + Name(graph, link.from) + " -> " + Name(graph, link.to);
  text.EndLine();
  for (const Transition& rule : graph.TransitionsOf(link)) {
    const TerminalText line = RuleLine(graph, rule);
    text += "     " + line + std::string(width - line.Text().size() + 2, ' ') +
            painter.Paint(Colour::kCyan, PlaceText(rule.place));
    text.EndLine();
  }
  return text;
}

TerminalText PathText(const TransitionGraph& graph, const DomainPath& path, std::size_t number,
                      const Painter& painter) {
  TerminalText chain;
  for (const std::size_t domain : path) {
    chain += (domain == path.front() ? "" : " -> ") + Name(graph, domain);
  }
  TerminalText text = std::to_string(number) + ". " + painter.Paint(Colour::kBold, chain) + " (" +
                      Counted(path.size() - 1, "step") + ")";
  text.EndLine();
  for (std::size_t step = 0; step + 1 < path.size(); ++step) {
    text += StepText(graph, LinkOf(graph, path, step), painter);
  }
  return text;
}

json StepJson(const TransitionGraph& graph, const Link& link) {
  json rules = json::array();
  for (const Transition& rule : graph.TransitionsOf(link)) {
    rules.push_back({{"label", rule.label}, {"event", rule.event}, {"place", ToJson(rule.place)}});
  }
  return {{"from", graph.Domains()[link.from]},
          {"to", graph.Domains()[link.to]},
          {"rules", std::move(rules)}};
}

}  // namespace

std::size_t RequireDomain(const TransitionGraph& graph, const std::string& name) {
  if (const auto domain = graph.Find(name)) return *domain;
  throw std::runtime_error(UnknownWordText("domain", name, graph.Domains()));
}

TerminalText PathsText(const TransitionGraph& graph, const PathQuestion& question,
                       const FoundPaths& found, const Painter& painter) {
  if (found.paths.empty()) {
    return (Name(graph, question.to) + " is not reached from " + Name(graph, question.from) +
            (question.event ? " by " + *question.event : ""))
        .EndLine();
  }
  TerminalText text;
  for (std::size_t i = 0; i < found.paths.size(); ++i) {
    text += PathText(graph, found.paths[i], i + 1, painter);
  }
  if (found.hasMore) (text += "There are more paths, which are not shorter.").EndLine();
  return text;
}

json PathsJson(const TransitionGraph& graph, const PathQuestion& question,
               const FoundPaths& found) {
  json paths = json::array();
  for (const DomainPath& path : found.paths) {
    json steps = json::array();
    for (std::size_t step = 0; step + 1 < path.size(); ++step) {
      steps.push_back(StepJson(graph, LinkOf(graph, path, step)));
    }
    paths.push_back(std::move(steps));
  }
  return {{"from", graph.Domains()[question.from]},
          {"to", graph.Domains()[question.to]},
          {"paths", std::move(paths)},
          {"more", found.hasMore}};
}

}  // namespace SecPolicyTool
