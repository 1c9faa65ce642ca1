// The process that enters a host and runs its scenarios.
#pragma once

#include <string>
#include <vector>

#include "tests/faults/campaign.h"
#include "tests/faults/scoreboard.h"

namespace SecPolicyFaults {

struct Task {
  HostKind host;
  std::string hostDir;
  const std::vector<Scenario>& scenarios;
  const CampaignOptions& options;
};

// Enters the host and goes on where the board says; sets its `done` at the end. For a process of
// its own, which does nothing else afterwards.
void Work(const Task& task, Scoreboard& board);

}  // namespace SecPolicyFaults
