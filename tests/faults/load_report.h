// The log of a load, phase by phase: from it follows the whole log, with its summaries.
#pragma once

#include <array>
#include <string>
#include <vector>

#include "tests/faults/due.h"

namespace SecPolicyFaults {

struct PhaseReport {
  std::vector<DueLine> lines;  // without what sums up
  bool failed = false;         // something of it, so that its summary says so
  // Set when the failure ended the stage: what the stage throws.
  std::string stageText = {};
  bool endedQuietly = false;  // the default tardisk policy ended by a text of its own
};

struct LoadReport {
  std::array<PhaseReport, kPhases> phases;
  std::string missingDomain;  // what is logged before the process ends; empty for none

  PhaseReport& Of(Phase phase) { return phases[Index(phase)]; }
  [[nodiscard]] const PhaseReport& Of(Phase phase) const { return phases[Index(phase)]; }
};

// Whether a line of the phase follows from the others.
bool IsSummary(Phase phase, const DueLine& line);

LoadReport ReportOf(const Baseline& baseline);

// The log, the ending and its text that follow from the report of the scenario's phases.
void Tell(const Scenario& scenario, const LoadReport& report, Due& due);

}  // namespace SecPolicyFaults
