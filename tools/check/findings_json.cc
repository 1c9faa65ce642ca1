#include "tools/check/findings_json.h"

#include <array>
#include <nlohmann/json.hpp>
#include <utility>

namespace SecPolicyTool {

using nlohmann::json;

namespace {

// There may be very many, so that texts are moved and not copied.
constexpr std::array<std::string Finding::*, 5> kTexts{
    &Finding::id, &Finding::message, &Finding::loadMessage, &Finding::help, &Finding::source};
constexpr std::size_t kOthers = 5;

}  // namespace

json ToJson(std::vector<Finding> findings) {
  json entries = json::array();
  for (Finding& finding : findings) {
    json entry{finding.severity == Severity::kError, std::move(finding.place.file),
               finding.place.line, finding.place.column, finding.length};
    for (const auto text : kTexts) entry.push_back(std::move(finding.*text));
    entries.push_back(std::move(entry));
  }
  return entries;
}

std::vector<Finding> FindingsOfJson(json entries) {
  std::vector<Finding> findings;
  for (json& entry : entries) {
    Finding finding;
    finding.severity = entry.at(0).get<bool>() ? Severity::kError : Severity::kWarning;
    finding.place = {std::move(entry.at(1).get_ref<std::string&>()), entry.at(2), entry.at(3)};
    finding.length = entry.at(4);
    for (std::size_t i = 0; i < kTexts.size(); ++i) {
      finding.*kTexts[i] = std::move(entry.at(kOthers + i).get_ref<std::string&>());
    }
    findings.push_back(std::move(finding));
  }
  return findings;
}

}  // namespace SecPolicyTool
