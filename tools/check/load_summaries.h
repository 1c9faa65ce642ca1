// Texts of a load that say nothing of their own.
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

namespace SecPolicyTool {

// What a text that only sums up sums up.
enum class Span : std::uint8_t {
  kStage,     // what the stage reported so far
  kStageEnd,  // the same, and the stage is over
  kLoad,      // what the load reported so far
};

// Nothing for a text that is no summary.
std::optional<Span> SummarizedBy(std::string_view text);

// The beginning of a text whose cause is the next one, up to what it is about; empty for others.
std::string_view HeadingOf(std::string_view text);

// Whether the text is the last one of a load that is terminated.
bool IsTermination(std::string_view text);

}  // namespace SecPolicyTool
