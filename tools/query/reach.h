// Which domains a program can come to.
#pragma once

#include <map>
#include <optional>
#include <string>
#include <vector>

#include "tools/graph/transition_graph.h"
#include "tools/policy/policy.h"

namespace SecPolicyTool {

// A granted transition. Both live as long as the policy.
struct Step {
  const std::string* from = nullptr;
  const PolicyRule* rule = nullptr;
};

// The ways that a policy's granted transitions make. The policy must live as long as this.
class Ways {
 public:
  explicit Ways(const Policy& policy) : policy_(policy) {}

  // A shortest way from one domain to another, by transitions of `event` or, without it, of any;
  // no steps from a domain to itself. Nothing when there is no way, or no such domain.
  [[nodiscard]] std::optional<std::vector<Step>> Shortest(const std::string& from,
                                                          const std::string& to,
                                                          const std::optional<std::string>& event);

 private:
  const Policy& policy_;
  std::map<std::optional<std::string>, TransitionGraph> graphs_;  // by event, as they are asked for
};

}  // namespace SecPolicyTool
