#include <algorithm>

#include "tools/check/line_excerpt.h"
#include "tools/check/report_forms.h"
#include "tools/policy/counted.h"

namespace SecPolicyTool {

namespace {

TerminalText PlaceInFront(const Place& place) {
  return place.file.empty() ? "" : PlaceText(place) + ": ";
}

TerminalText MarkedLine(const Finding& finding, Colour colour, const Painter& painter) {
  if (finding.place.line == 0) return {};
  const LineExcerpt excerpt = ExcerptOf(finding.source, finding.place.column, finding.length);
  const std::size_t indent = excerpt.mark.find('^');
  TerminalText text = ("  " + excerpt.text).EndLine();
  text +=
      "  " + excerpt.mark.substr(0, indent) + painter.Paint(colour, excerpt.mark.substr(indent));
  return text.EndLine();
}

}  // namespace

FindingCounts CountsOf(const CheckReport& report) {
  const auto errors = static_cast<std::size_t>(
      std::count_if(report.findings.begin(), report.findings.end(),
                    [](const Finding& finding) { return finding.severity == Severity::kError; }));
  return {errors, report.findings.size() - errors};
}

TerminalText TextForm(const Finding& finding, const Painter& painter) {
  const bool isError = finding.severity == Severity::kError;
  const Colour colour = isError ? Colour::kRed : Colour::kYellow;
  TerminalText text = painter.Paint(Colour::kBold, PlaceInFront(finding.place)) +
                      painter.Paint(colour, isError ? "error:" : "warning:") + " " +
                      finding.message + " [" + finding.id + "]";
  text.EndLine() += MarkedLine(finding, colour, painter);
  if (!finding.help.empty()) {
    text += painter.Paint(Colour::kCyan, "help:") + " " + finding.help;
    text.EndLine();
  }
  return text;
}

std::string SummaryForm(const CheckReport& report) {
  const FindingCounts counts = CountsOf(report);
  return Counted(counts.errors, "error") + ", " + Counted(counts.warnings, "warning") + " in " +
         Counted(report.files, "file");
}

}  // namespace SecPolicyTool
