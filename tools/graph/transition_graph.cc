#include "tools/graph/transition_graph.h"

#include <algorithm>
#include <set>
#include <tuple>

namespace SecPolicyTool {

namespace {

bool IsEdge(const PolicyRule& rule) {
  return rule.key.type == RuleType::kTransition && rule.isGranted;
}

const std::string& LabelOf(const PolicyRule& rule) { return rule.key.words.at(0); }
const std::string& TargetOf(const PolicyRule& rule) { return rule.key.words.at(1); }
const std::string& EventOf(const PolicyRule& rule) { return rule.key.words.at(2); }

}  // namespace

TransitionGraph::TransitionGraph(const Policy& policy, const std::optional<std::string>& event) {
  AddDomains(policy);
  AddTransitions(policy, event);
  AddLinks();
}

void TransitionGraph::AddDomains(const Policy& policy) {
  std::set<std::string> names;
  for (const auto& [name, domain] : policy.domains) {
    names.insert(name);
    for (const PolicyRule& rule : domain.rules) {
      if (IsEdge(rule)) names.insert(TargetOf(rule));
    }
  }
  domains_.assign(names.begin(), names.end());
}

void TransitionGraph::AddTransitions(const Policy& policy,
                                     const std::optional<std::string>& event) {
  for (const auto& [name, domain] : policy.domains) {
    const std::size_t from = Find(name).value();
    for (const PolicyRule& rule : domain.rules) {
      if (!IsEdge(rule) || (event && EventOf(rule) != *event)) continue;
      transitions_.push_back(
          {from, Find(TargetOf(rule)).value(), LabelOf(rule), EventOf(rule), rule.place, &rule});
    }
  }
  const auto orderOf = [](const Transition& transition) {
    return std::tie(transition.from, transition.to, transition.event, transition.label);
  };
  std::sort(transitions_.begin(), transitions_.end(),
            [&](const Transition& a, const Transition& b) { return orderOf(a) < orderOf(b); });
}

void TransitionGraph::AddLinks() {
  for (std::size_t i = 0; i < transitions_.size(); ++i) {
    const Transition& transition = transitions_[i];
    const bool isNew = links_.empty() || links_.back().from != transition.from ||
                       links_.back().to != transition.to;
    if (isNew) links_.push_back({transition.from, transition.to, i, 0});
    ++links_.back().count;
  }
  firstLinks_.assign(domains_.size() + 1, 0);
  for (const Link& link : links_) ++firstLinks_[link.from + 1];
  for (std::size_t i = 1; i < firstLinks_.size(); ++i) firstLinks_[i] += firstLinks_[i - 1];
}

std::span<const Link> TransitionGraph::LinksFrom(std::size_t domain) const {
  const std::size_t first = firstLinks_.at(domain);
  return std::span(links_).subspan(first, firstLinks_.at(domain + 1) - first);
}

std::span<const Transition> TransitionGraph::TransitionsOf(const Link& link) const {
  return std::span(transitions_).subspan(link.first, link.count);
}

std::optional<std::size_t> TransitionGraph::Find(const std::string& domain) const {
  const auto found = std::lower_bound(domains_.begin(), domains_.end(), domain);
  if (found == domains_.end() || *found != domain) return std::nullopt;
  return static_cast<std::size_t>(found - domains_.begin());
}

}  // namespace SecPolicyTool
