// Questions to a policy, and the answers as programs read them.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>
#include <vector>

#include "host/state/host_directory.h"
#include "tools/query/decision.h"
#include "tools/query/host_paths.h"
#include "tools/query/question.h"
#include "tools/query/vocabulary.h"

namespace SecPolicyTool {

// The policy that is asked, and what its questions may speak of.
struct AskedPolicy {
  // Throws HostError when the host is damaged.
  AskedPolicy(Policy askedPolicy, const StandIn::HostDirectory& host);

  // The file that `path`, an absolute one, leads to, with the label that the policy gives it. What
  // the host does not have, and what carries a label that was removed, has none.
  [[nodiscard]] StandIn::FileObject FileAt(const std::string& path) const;

  // Throws BadQuestion.
  [[nodiscard]] Question Parse(const std::vector<std::string>& words) const;

  Policy policy;
  Vocabulary vocabulary;
  HostPaths paths;
};

// A question as it was put.
struct PutQuestion {
  std::string source;  // of the policy
  std::vector<std::string> words;
};

// A domain that is allowed something, and the rule that decides; both live as long as the policy.
struct AllowedDomain {
  std::string name;
  const PolicyRule* rule;
};

// By name.
std::vector<AllowedDomain> AllowedBy(const Policy& policy, const Question& question);

// docs/schemas/may.schema.json.
nlohmann::json MayJson(const PutQuestion& put, const std::string& domain, const Question& question,
                       const Answer& answer);

// docs/schemas/who.schema.json.
nlohmann::json WhoJson(const PutQuestion& put, const Question& question,
                       const std::vector<AllowedDomain>& allowed);

}  // namespace SecPolicyTool
