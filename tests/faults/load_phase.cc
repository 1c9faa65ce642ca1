#include "tests/faults/load_phase.h"

#include <algorithm>

namespace SecPolicyFaults {

namespace {

bool IsLog(const Event& event) {
  return event.kind == EventKind::kInfo || event.kind == EventKind::kError;
}

bool IsCall(const Event& event, const std::string& name, const std::string& pathEnd) {
  return event.kind == EventKind::kFile && event.text.starts_with(name + " ") &&
         event.text.ends_with(pathEnd);
}

// Whether an event of the phase is its last.
bool Ends(Phase phase, const Event& event) {
  const PhaseInfo& info = InfoOf(phase);
  if (info.success != nullptr) {
    const std::string text = event.text.substr(event.text.starts_with("Error: ") ? 7 : 0);
    return IsLog(event) &&
           (text == info.success || (info.failure != nullptr && text == info.failure));
  }
  switch (phase) {
    case Phase::kStart:
      return IsLog(event);
    case Phase::kTardisksFind:
      return IsCall(event, "closedir", "/secpolicy/tardisks");
    default:
      return false;
  }
}

// Whether an event behind the phase's is the first of the next one.
bool Follows(Phase phase, const Event& event) {
  switch (phase) {
    case Phase::kWellKnown:
      return IsCall(event, "opendir", "/tardisks/");
    case Phase::kTardisksDefault:
      return IsCall(event, "opendir", "/fileLabels");
    case Phase::kLabelsSet:
      return event.text == "close-interface" || event.text == kLoadSuccess;
    default:
      return false;
  }
}

Phase Next(Phase phase) { return static_cast<Phase>(Index(phase) + 1); }

// What sums up a stage stands behind its last phase in the log, and belongs to it.
bool SumsUp(Phase phase, const Event& event) {
  if (phase == Phase::kStart || !IsLog(event)) return false;
  const auto last = static_cast<Phase>(Index(phase) - 1);
  const char* const failure = FailureOf(InfoOf(last).stage);
  return (failure != nullptr && event.text == std::string("Error: ") + failure) ||
         (last == Phase::kTardisksSet &&
          event.text == std::string("Error: ") + kSpecifiedTardisksFailure);
}

}  // namespace

std::vector<Phase> PhasesOf(const std::vector<Event>& events, Phase first) {
  std::vector<Phase> phases;
  Phase phase = first;
  for (const Event& event : events) {
    if (phase != Phase::kDone && Follows(phase, event)) phase = Next(phase);
    phases.push_back(SumsUp(phase, event) ? static_cast<Phase>(Index(phase) - 1) : phase);
    if (Ends(phase, event)) phase = Next(phase);
  }
  return phases;
}

}  // namespace SecPolicyFaults
