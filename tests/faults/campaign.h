// Runs every scenario with every fault and keeps the score.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "tests/faults/scenario.h"

namespace SecPolicyFaults {

enum class Form : std::uint8_t { kShort, kLong };

struct CampaignOptions {
  std::vector<std::string> scenarios;  // empty: all
  std::vector<std::string> faults;     // empty: all
  std::uint64_t stride = 0;            // 0: as the form says
  std::optional<std::uint64_t> only;
  Form form = Form::kShort;
};

struct Score {
  std::uint64_t injected = 0;
  std::uint64_t unexplained = 0;
};

// Prints each unexplained fault as it comes and a table at the end, to standard output.
Score RunCampaign(const CampaignOptions& options);

}  // namespace SecPolicyFaults
