#include "tools/check/check.h"

#include <utility>

#include "tools/policy/policy_source.h"

namespace SecPolicyTool {

std::vector<Finding> CheckPolicy(StandIn::HostDirectory host, const std::string& dir) {
  std::vector<Finding> findings;
  for (const std::string& error : ReadSource(std::move(host), dir).errors) {
    Finding finding;
    finding.id = "load-error";
    finding.message = finding.loadMessage = error;
    findings.push_back(finding);
  }
  return findings;
}

}  // namespace SecPolicyTool
