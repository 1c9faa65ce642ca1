#include <algorithm>

#include "tools/check/line_excerpt.h"
#include "tools/check/report_forms.h"

namespace SecPolicyTool {

namespace {

std::string Counted(std::size_t count, const char* what) {
  return std::to_string(count) + " " + what + (count == 1 ? "" : "s");
}

std::string PlaceInFront(const Place& place) {
  return place.file.empty() ? std::string() : Printable(PlaceText(place)) + ": ";
}

std::string MarkedLine(const Finding& finding, Colour colour, const Painter& painter) {
  if (finding.place.line == 0) return {};
  const LineExcerpt excerpt = ExcerptOf(finding.source, finding.place.column, finding.length);
  const std::size_t indent = excerpt.mark.find('^');
  return "  " + excerpt.text + "\n  " + excerpt.mark.substr(0, indent) +
         painter.Paint(colour, excerpt.mark.substr(indent)) + "\n";
}

}  // namespace

FindingCounts CountsOf(const CheckReport& report) {
  const auto errors = static_cast<std::size_t>(
      std::count_if(report.findings.begin(), report.findings.end(),
                    [](const Finding& finding) { return finding.severity == Severity::kError; }));
  return {errors, report.findings.size() - errors};
}

std::string TextForm(const Finding& finding, const Painter& painter) {
  const bool isError = finding.severity == Severity::kError;
  const Colour colour = isError ? Colour::kRed : Colour::kYellow;
  std::string text = painter.Paint(Colour::kBold, PlaceInFront(finding.place)) +
                     painter.Paint(colour, isError ? "error:" : "warning:") + " " +
                     Printable(finding.message) + " [" + finding.id + "]\n" +
                     MarkedLine(finding, colour, painter);
  if (!finding.help.empty()) {
    text += painter.Paint(Colour::kCyan, "help:") + " " + Printable(finding.help) + "\n";
  }
  return text;
}

std::string SummaryForm(const CheckReport& report) {
  const FindingCounts counts = CountsOf(report);
  return Counted(counts.errors, "error") + ", " + Counted(counts.warnings, "warning") + " in " +
         Counted(report.files, "file");
}

}  // namespace SecPolicyTool
