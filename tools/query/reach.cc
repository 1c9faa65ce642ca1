#include "tools/query/reach.h"

#include <algorithm>
#include <deque>

namespace SecPolicyTool {

namespace {

// The words of a transition: label, target domain, event.
const std::string& TargetOf(const Step& step) { return step.rule->key.words[1]; }
const std::string& EventOf(const Step& step) { return step.rule->key.words[2]; }

// How each domain was come to first.
using Arrivals = std::map<std::string, Step>;

std::vector<Step> WayBack(const std::string& to, const Arrivals& arrivals) {
  std::vector<Step> way;
  for (const std::string* at = &to;;) {
    const Step& step = arrivals.at(*at);
    if (step.rule == nullptr) break;
    way.push_back(step);
    at = step.from;
  }
  std::reverse(way.begin(), way.end());
  return way;
}

}  // namespace

Steps::Steps(const Policy& policy) {
  for (const auto& [name, domain] : policy.domains) {
    for (const PolicyRule& rule : domain.rules) {
      if (rule.key.type != RuleType::kTransition || !rule.isGranted) continue;
      from_[name].push_back({&name, &rule});
    }
  }
}

std::optional<std::vector<Step>> Steps::WayTo(const std::string& from, const std::string& to,
                                              const std::optional<std::string>& event) const {
  Arrivals arrivals{{from, Step{}}};
  std::deque<std::string> waiting{from};
  while (!waiting.empty() && !arrivals.contains(to)) {
    const auto steps = from_.find(waiting.front());
    waiting.pop_front();
    if (steps == from_.end()) continue;
    for (const Step& step : steps->second) {
      if (event && EventOf(step) != *event) continue;
      if (arrivals.emplace(TargetOf(step), step).second) waiting.push_back(TargetOf(step));
    }
  }
  if (!arrivals.contains(to)) return std::nullopt;
  return WayBack(to, arrivals);
}

bool Reaches(const Policy& policy, const std::string& from, const std::string& to,
             const std::optional<std::string>& event) {
  return Steps(policy).WayTo(from, to, event).has_value();
}

}  // namespace SecPolicyTool
