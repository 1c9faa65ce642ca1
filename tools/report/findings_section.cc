#include <algorithm>
#include <utility>

#include "tools/report/sections.h"

namespace SecPolicyTool {

namespace {

// The line with what is wrong in it marked.
Html SourceLine(const Finding& finding) {
  const std::string& line = finding.source;
  const std::size_t start =
      std::min<std::size_t>(finding.place.column == 0 ? 0 : finding.place.column - 1, line.size());
  const std::size_t length = finding.length == 0 ? line.size() : finding.length;
  const std::string marked = line.substr(start, length);
  return Element("code", {{"class", "line"}},
                 Html(line.substr(0, start)) + Element("mark", marked) +
                     Html(line.substr(start + marked.size())));
}

Html FindingEntry(const Finding& finding) {
  const bool isError = finding.severity == Severity::kError;
  Html content =
      Element("b", {{"class", isError ? "error" : "warning"}}, isError ? "error" : "warning") +
      " " + Element("span", finding.message) + " " + PlaceHtml(finding.place);
  if (!finding.source.empty()) content += SourceLine(finding);
  if (!finding.help.empty()) content += Element("p", finding.help);
  return Element("li", {{"class", "entry"}}, content);
}

}  // namespace

Html FindingsSection(const ReportContext& context) {
  if (!context.report.findings) return {};
  Html entries;
  for (const Finding& finding : *context.report.findings) entries += FindingEntry(finding);
  return Section("findings", "Findings",
                 entries.IsEmpty() ? Element("p", "A check of its files finds nothing.")
                                   : Element("ul", {{"class", "list"}}, std::move(entries)));
}

}  // namespace SecPolicyTool
