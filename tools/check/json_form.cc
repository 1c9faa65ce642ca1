#include "tools/check/report_forms.h"

#include <nlohmann/json.hpp>

namespace SecPolicyTool {

using nlohmann::json;

namespace {

void AddUnlessEmpty(json& entry, const char* name, const std::string& text) {
  if (!text.empty()) entry[name] = text;
}

json FormOf(const Finding& finding) {
  json entry{{"id", finding.id},
             {"severity", finding.severity == Severity::kError ? "error" : "warning"},
             {"message", finding.message}};
  AddUnlessEmpty(entry, "file", finding.place.file);
  if (finding.place.line != 0) {
    entry["line"] = finding.place.line;
    entry["column"] = finding.place.column;
    entry["length"] = finding.length;
    entry["source"] = finding.source;
  }
  AddUnlessEmpty(entry, "loadMessage", finding.loadMessage);
  AddUnlessEmpty(entry, "help", finding.help);
  return entry;
}

}  // namespace

json JsonForm(const CheckReport& report, const std::string& source) {
  const FindingCounts counts = CountsOf(report);
  json findings = json::array();
  for (const Finding& finding : report.findings) findings.push_back(FormOf(finding));
  return {{"source", source},
          {"files", report.files},
          {"errors", counts.errors},
          {"warnings", counts.warnings},
          {"findings", std::move(findings)}};
}

}  // namespace SecPolicyTool
