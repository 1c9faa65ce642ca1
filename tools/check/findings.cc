#include "tools/check/findings.h"

#include <algorithm>
#include <tuple>
#include <utility>

namespace SecPolicyTool {

Spot SpotOf(const std::string& shown) {
  Spot spot;
  spot.place.file = shown;
  return spot;
}

Spot SpotOf(const CheckedFile& file) { return SpotOf(file.shown); }

Spot SpotAt(const CheckedFile& file, const PolicyLine& line, std::size_t column,
            std::size_t length) {
  Spot spot = SpotOf(file);
  spot.place.line = line.number;
  spot.place.column = static_cast<unsigned int>(column);
  spot.length = static_cast<unsigned int>(length);
  spot.source = line.whole;
  return spot;
}

Spot SpotFrom(const CheckedFile& file, const PolicyLine& line, std::size_t first) {
  const std::size_t begin = line.words.at(first).column;
  const LineWord& last = line.words.back();
  return SpotAt(file, line, begin, last.column + last.text.size() - begin);
}

Spot SpotOf(const CheckedFile& file, const PolicyLine& line) { return SpotFrom(file, line, 0); }

Spot SpotOf(const CheckedFile& file, const PolicyLine& line, const LineWord& word) {
  return SpotAt(file, line, word.column, word.text.size());
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
