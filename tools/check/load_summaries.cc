#include "tools/check/load_summaries.h"

#include <algorithm>
#include <array>

namespace SecPolicyTool {

namespace {

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

}  // namespace

std::optional<Span> SummarizedBy(std::string_view text) {
  const auto found = std::find_if(kSummaries.begin(), kSummaries.end(),
                                  [&](const Summary& one) { return text.starts_with(one.begin); });
  return found == kSummaries.end() ? std::nullopt : std::optional(found->span);
}

std::string_view HeadingOf(std::string_view text) {
  const auto found = std::find_if(kHeadings.begin(), kHeadings.end(),
                                  [&](std::string_view one) { return text.starts_with(one); });
  return found == kHeadings.end() ? std::string_view() : *found;
}

bool IsTermination(std::string_view text) { return text.starts_with(kTermination); }

}  // namespace SecPolicyTool
