#include "tools/check/load_errors.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <charconv>
#include <string_view>

namespace SecPolicyTool {

namespace {

// What a text that only sums up sums up.
enum class Span {
  kStage,     // what the stage reported so far
  kStageEnd,  // the same, and the stage is over
  kLoad,      // what the load reported so far
};

struct Summary {
  std::string_view begin;
  Span span;
};

// Of a domain that may well have a file, when another one could not be made.
constexpr std::string_view kTermination = "Failed to fetch domainID for ";

constexpr std::array kSummaries{
    Summary{"Error in parsing some object files", Span::kStage},
    Summary{"Failure in object policy", Span::kStageEnd},
    Summary{"Error in parsing the policy for some domains", Span::kStage},
    Summary{"Error in policy constraints check for some domains", Span::kStage},
    Summary{"Skipping the policy for domain ", Span::kStage},
    Summary{"Error in setting the policy for some domains", Span::kStage},
    Summary{"Failure in domain policy", Span::kStageEnd},
    Summary{kTermination, Span::kLoad},
    Summary{"Ignoring ", Span::kStage},
    Summary{"Error in parsing some tardisk policy files", Span::kStage},
    Summary{"Error in setting some tardisk labels and policy", Span::kStage},
    Summary{"Failure in setting specified tardisk policy", Span::kStage},
    Summary{"Failure in setting default tardisk policy", Span::kStage},
    Summary{"Failure in setting tardisk policy", Span::kStageEnd},
    Summary{"Error in parsing some file label mappings.", Span::kStage},
    Summary{"There was a failure in setting file labels", Span::kStage},
    Summary{"Error in setting some file labels.", Span::kStage},
    Summary{"Failure in file labels policy", Span::kStageEnd},
    Summary{"There were some problems encountered in setting the policy", Span::kLoad},
};

// Texts whose cause is the next one.
constexpr std::array<std::string_view, 3> kHeadings{
    "Error parsing file ",
    "Failed to set default tardisk rule: ", "Failed to set default tardisk label: "};

const Summary* SummaryOf(std::string_view text) {
  const auto found = std::find_if(kSummaries.begin(), kSummaries.end(),
                                  [&](const Summary& one) { return text.starts_with(one.begin); });
  return found == kSummaries.end() ? nullptr : &*found;
}

std::string_view HeadingOf(std::string_view text) {
  const auto found = std::find_if(kHeadings.begin(), kHeadings.end(),
                                  [&](std::string_view one) { return text.starts_with(one); });
  return found == kHeadings.end() ? std::string_view() : *found;
}

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

std::string PlaceKey(const std::string& file, unsigned int line) {
  return file + ":" + std::to_string(line);
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
  LoadError error{text, {}, 0, text};
  std::string_view rest = text;
  for (const std::string_view start :
       {"Error in parsing policy for domain: ", "Error in setting policy for domain: "}) {
    if (rest.starts_with(start)) rest.remove_prefix(start.size());
  }
  const std::size_t end = rest.find(" : ");
  if (end == std::string_view::npos) return error;
  std::size_t digits = end;
  while (digits > 0 && IsDigit(rest[digits - 1])) --digits;
  unsigned int line = 0;
  const auto read = std::from_chars(rest.data() + digits, rest.data() + end, line);
  std::string_view file = rest.substr(0, digits);
  if (file.ends_with(": ")) file.remove_suffix(1);
  if (digits == end || read.ec != std::errc() || !file.ends_with(':')) return error;
  file.remove_suffix(1);
  return {text, std::string(file), line, std::string(rest.substr(end + 3))};
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
  return !errors_.empty() && errors_.back().text.starts_with(kTermination);
}

const LoadError* LoadErrors::At(const std::string& path, unsigned int line) const {
  const auto found = places_.find(PlaceKey(path, line));
  return found == places_.end() ? nullptr : &errors_[found->second];
}

void LoadErrors::AddUnexplained(const std::vector<const CheckedDirectory*>& directories,
                                Findings& findings) const {
  const FilesByName files(directories);
  bool isCauseInStage = false;
  bool isCauseInLoad = false;
  std::string fileOfHeading;
  for (const LoadError& error : errors_) {
    const bool isExplained = findings.Explains(error.text);
    if (const std::string_view heading = HeadingOf(error.text); !heading.empty()) {
      fileOfHeading = error.text.substr(heading.size());
      if (&error != &errors_.back()) continue;
    }
    const Summary* summary = SummaryOf(error.text);
    const bool isCauseKnown =
        summary != nullptr && (summary->span == Span::kLoad ? isCauseInLoad : isCauseInStage);
    if (!isExplained && !isCauseKnown) {
      LoadError placed = error;
      if (placed.file.empty()) placed.file = fileOfHeading;
      findings.AddError(Kind::kLoadError, files.SpotOf(placed), error.cause, error.text);
    }
    fileOfHeading.clear();
    isCauseInLoad = true;
    isCauseInStage = summary == nullptr || summary->span != Span::kStageEnd;
  }
}

}  // namespace SecPolicyTool
