#include "tools/check/findings_json.h"

namespace SecPolicyTool {

using nlohmann::json;

json ToJson(const std::vector<Finding>& findings) {
  json entries = json::array();
  for (const Finding& finding : findings) {
    entries.push_back({finding.id, finding.severity == Severity::kError, finding.place.file,
                       finding.place.line, finding.place.column, finding.length, finding.message,
                       finding.loadMessage, finding.help, finding.source});
  }
  return entries;
}

std::vector<Finding> FindingsOfJson(const json& entries) {
  std::vector<Finding> findings;
  for (const json& entry : entries) {
    Finding finding;
    finding.id = entry.at(0);
    finding.severity = entry.at(1).get<bool>() ? Severity::kError : Severity::kWarning;
    finding.place = {entry.at(2), entry.at(3), entry.at(4)};
    finding.length = entry.at(5);
    finding.message = entry.at(6);
    finding.loadMessage = entry.at(7);
    finding.help = entry.at(8);
    finding.source = entry.at(9);
    findings.push_back(std::move(finding));
  }
  return findings;
}

}  // namespace SecPolicyTool
