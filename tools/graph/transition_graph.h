// Which domain goes where: a policy's granted transitions as a graph.
#pragma once

#include <cstddef>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "tools/policy/policy.h"

namespace SecPolicyTool {

// A granted rule: when `event` happens to something with `label`, a program of the domain `from`
// goes to the domain `to`. Both are indices into TransitionGraph::Domains.
struct Transition {
  std::size_t from = 0;
  std::size_t to = 0;
  std::string label;
  std::string event;
  std::optional<Place> place;
  const PolicyRule* rule = nullptr;  // lives as long as the policy
};

// All transitions from one domain to another.
struct Link {
  std::size_t from = 0;
  std::size_t to = 0;
  std::size_t first = 0;  // of its transitions
  std::size_t count = 0;
};

class TransitionGraph {
 public:
  // The granted transitions of `policy`; with `event`, those on that event only. Revoked ones are
  // no part of it. Its size and the time that it takes go with the number of rules.
  explicit TransitionGraph(const Policy& policy,
                           const std::optional<std::string>& event = std::nullopt);

  // All of the policy's, by name in byte order, also those without a transition.
  [[nodiscard]] const std::vector<std::string>& Domains() const { return domains_; }
  // By their domains, then by event and label.
  [[nodiscard]] const std::vector<Transition>& Transitions() const { return transitions_; }
  // By their domains.
  [[nodiscard]] const std::vector<Link>& Links() const { return links_; }

  // The links that leave a domain, by target.
  [[nodiscard]] std::span<const Link> LinksFrom(std::size_t domain) const;
  [[nodiscard]] std::span<const Transition> TransitionsOf(const Link& link) const;

  // Nothing when there is none of that name.
  [[nodiscard]] std::optional<std::size_t> Find(const std::string& domain) const;

 private:
  void AddDomains(const Policy& policy);
  void AddTransitions(const Policy& policy, const std::optional<std::string>& event);
  void AddLinks();

  std::vector<std::string> domains_;
  std::vector<Transition> transitions_;
  std::vector<Link> links_;
  std::vector<std::size_t> firstLinks_;  // of each domain, and the number of links at the end
};

}  // namespace SecPolicyTool
