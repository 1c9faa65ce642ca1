#include "tools/check/findings.h"

#include <algorithm>
#include <tuple>
#include <utility>

namespace SecPolicyTool {

Spot SpotOf(const CheckedFile& file) { return {{file.shown, 0, 0}, 0, {}}; }

Spot SpotFrom(const CheckedFile& file, const PolicyLine& line, std::size_t first) {
  const LineWord& begin = line.words.at(first);
  const LineWord& last = line.words.back();
  const auto end = last.column + static_cast<unsigned int>(last.text.size());
  return {{file.shown, line.number, begin.column}, end - begin.column, line.whole};
}

Spot SpotOf(const CheckedFile& file, const PolicyLine& line) { return SpotFrom(file, line, 0); }

Spot SpotOf(const CheckedFile& file, const PolicyLine& line, const LineWord& word) {
  return {{file.shown, line.number, word.column},
          static_cast<unsigned int>(word.text.size()),
          line.whole};
}

namespace {

Finding Make(Kind kind, Severity severity, Spot spot, std::string message, std::string help) {
  Finding finding;
  finding.id = InfoOf(kind).id;
  finding.severity = severity;
  finding.place = std::move(spot.place);
  finding.length = spot.length;
  finding.message = std::move(message);
  finding.help = std::move(help);
  finding.source = std::move(spot.source);
  return finding;
}

}  // namespace

void Findings::AddError(Kind kind, Spot spot, std::string message, std::string loadMessage,
                        std::string help) {
  loadMessages_.insert(loadMessage);
  findings_.push_back(
      Make(kind, Severity::kError, std::move(spot), std::move(message), std::move(help)));
  findings_.back().loadMessage = std::move(loadMessage);
}

void Findings::AddWarning(Kind kind, Spot spot, std::string message, std::string help) {
  findings_.push_back(
      Make(kind, Severity::kWarning, std::move(spot), std::move(message), std::move(help)));
}

std::vector<Finding> Findings::Sorted() && {
  const auto order = [](const Finding& finding) {
    const Place& place = finding.place;
    return std::tuple<bool, const std::string&, unsigned int, unsigned int>(
        place.file.empty(), place.file, place.line, place.column);
  };
  std::stable_sort(findings_.begin(), findings_.end(),
                   [&](const Finding& a, const Finding& b) { return order(a) < order(b); });
  return std::move(findings_);
}

}  // namespace SecPolicyTool
