// Which domains a program can come to.
#pragma once

#include <map>
#include <optional>
#include <string>
#include <vector>

#include "tools/policy/policy.h"

namespace SecPolicyTool {

// A granted transition. Both live as long as the policy.
struct Step {
  const std::string* from = nullptr;
  const PolicyRule* rule = nullptr;
};

// The granted transitions of a policy, which must live as long as this.
class Steps {
 public:
  explicit Steps(const Policy& policy);

  // A shortest way from one domain to another, by transitions of `event` or, without it, of any;
  // no steps from a domain to itself. Nothing when there is no way.
  [[nodiscard]] std::optional<std::vector<Step>> WayTo(
      const std::string& from, const std::string& to,
      const std::optional<std::string>& event) const;

 private:
  std::map<std::string, std::vector<Step>> from_;
};

// Whether there is such a way.
bool Reaches(const Policy& policy, const std::string& from, const std::string& to,
             const std::optional<std::string>& event);

}  // namespace SecPolicyTool
