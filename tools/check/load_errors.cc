#include "tools/check/load_errors.h"

#include <charconv>
#include <optional>
#include <string_view>

#include "tools/check/load_summaries.h"

namespace SecPolicyTool {

namespace {

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

std::string PlaceKey(const std::string& file, unsigned int line) {
  return file + ":" + std::to_string(line);
}

// "FILE:LINE" or "FILE: LINE".
std::optional<Place> PlaceOf(std::string_view text) {
  std::size_t digits = text.size();
  while (digits > 0 && IsDigit(text[digits - 1])) --digits;
  Place place;
  const auto read = std::from_chars(text.data() + digits, text.data() + text.size(), place.line);
  if (digits == text.size() || read.ec != std::errc()) return std::nullopt;
  text = text.substr(0, digits);
  if (text.ends_with(": ")) text.remove_suffix(1);
  if (!text.ends_with(':')) return std::nullopt;
  text.remove_suffix(1);
  place.file = text;
  return place;
}

// The files by the names that errors give them.
class FilesByName {
 public:
  explicit FilesByName(const std::vector<const CheckedDirectory*>& directories) {
    for (const CheckedDirectory* directory : directories) {
      const bool isDomains = directory->path.ends_with("/domains");
      for (const CheckedFile& file : directory->files) {
        files_.emplace(file.path, &file);
        if (isDomains) files_.emplace(file.name, &file);
      }
    }
  }

  [[nodiscard]] Spot SpotOf(const LoadError& error) const {
    const auto found = files_.find(error.file);
    if (found == files_.end()) return {};
    const CheckedFile& file = *found->second;
    if (error.line == 0 || error.line > file.text.lines.size()) {
      return SecPolicyTool::SpotOf(file);
    }
    const PolicyLine& line = file.text.lines[error.line - 1];
    if (line.words.empty()) return SecPolicyTool::SpotOf(file);
    return SecPolicyTool::SpotOf(file, line);
  }

 private:
  std::unordered_map<std::string, const CheckedFile*> files_;
};

}  // namespace

LoadError ParseLoadError(const std::string& text) {
  std::string_view rest = text;
  for (const std::string_view start :
       {"Error in parsing policy for domain: ", "Error in setting policy for domain: "}) {
    if (rest.starts_with(start)) rest.remove_prefix(start.size());
  }
  constexpr std::string_view kEnd = " : ";
  for (std::size_t at = 0; (at = rest.find(kEnd, at)) != std::string_view::npos; ++at) {
    if (const auto place = PlaceOf(rest.substr(0, at))) {
      return {text, place->file, place->line, std::string(rest.substr(at + kEnd.size()))};
    }
  }
  return {text, {}, 0, text};
}

LoadErrors::LoadErrors(const std::vector<std::string>& texts) {
  for (const std::string& text : texts) {
    LoadError error = ParseLoadError(text);
    if (error.line != 0 && text.starts_with(error.file)) {
      places_.emplace(PlaceKey(error.file, error.line), errors_.size());
    }
    errors_.push_back(std::move(error));
  }
}

bool LoadErrors::IsTerminated() const {
  return !errors_.empty() && IsTermination(errors_.back().text);
}

const LoadError* LoadErrors::At(const std::string& path, unsigned int line) const {
  const auto found = places_.find(PlaceKey(path, line));
  return found == places_.end() ? nullptr : &errors_[found->second];
}

std::unordered_set<std::string_view> LoadErrors::Explained(const Findings& findings) const {
  std::unordered_set<std::string_view> reported;
  for (const LoadError& error : errors_) reported.insert(error.text);
  std::unordered_set<std::string_view> explained;
  for (const Finding& finding : findings.All()) {
    const auto found = reported.find(finding.loadMessage);
    if (found != reported.end()) explained.insert(*found);
  }
  return explained;
}

void LoadErrors::AddUnexplained(const std::vector<const CheckedDirectory*>& directories,
                                Findings& findings) const {
  const FilesByName files(directories);
  const std::unordered_set<std::string_view> explained = Explained(findings);
  bool isCauseInStage = false;
  bool isCauseInLoad = false;
  std::string fileOfHeading;
  for (const LoadError& error : errors_) {
    const bool isExplained = explained.contains(error.text);
    if (const std::string_view heading = HeadingOf(error.text); !heading.empty()) {
      fileOfHeading = error.text.substr(heading.size());
      if (&error != &errors_.back()) continue;
    }
    const auto span = SummarizedBy(error.text);
    const bool isCauseKnown = span && (*span == Span::kLoad ? isCauseInLoad : isCauseInStage);
    if (!isExplained && !isCauseKnown) {
      LoadError placed = error;
      if (placed.file.empty()) placed.file = fileOfHeading;
      findings.AddError(Kind::kLoadError, files.SpotOf(placed), error.cause, error.text);
    }
    fileOfHeading.clear();
    isCauseInLoad = true;
    isCauseInStage = span != Span::kStageEnd;
  }
}

}  // namespace SecPolicyTool
