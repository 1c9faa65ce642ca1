// The phases of a load, and what ends each in the log.
#pragma once

#include <array>
#include <cstdint>
#include <string>
#include <vector>

#include "tests/faults/event_record.h"

namespace SecPolicyFaults {

enum class Phase : std::uint8_t {
  kStart,
  kObjectsRead,
  kObjectsSet,
  kDomainNames,
  kDomainsParse,
  kDomainsCheck,
  kDomainsSet,
  kWellKnown,
  kTardisksFind,
  kTardisksParse,
  kTardisksSet,
  kTardisksDefault,
  kLabelsParse,
  kLabelsSet,
  kDone,
};
inline constexpr std::size_t kPhases = 15;

constexpr std::size_t Index(Phase phase) { return static_cast<std::size_t>(phase); }

enum class Stage : std::uint8_t { kNone, kObjects, kDomains, kWellKnown, kTardisks, kLabels };

struct PhaseInfo {
  Stage stage;
  const char* success;  // the entry at its end; null for none
  const char* failure;  // instead, when something of it failed; null for none
};

// By Phase.
inline constexpr std::array<PhaseInfo, kPhases> kPhaseInfo{{
    {Stage::kNone, nullptr, nullptr},
    {Stage::kObjects, "Parsed all objects", "Error in parsing some object files"},
    {Stage::kObjects, "Objects defined and obsolete objects removed", nullptr},
    {Stage::kDomains, "Parsed all domain names", nullptr},
    {Stage::kDomains, "Domain policies parsed and syntax validated",
     "Error in parsing the policy for some domains"},
    {Stage::kDomains, "Constraints check for domain policies succeeded",
     "Error in policy constraints check for some domains"},
    {Stage::kDomains, "Domain policies set", "Error in setting the policy for some domains"},
    {Stage::kWellKnown, nullptr, nullptr},
    {Stage::kTardisks, nullptr, nullptr},
    {Stage::kTardisks, "Parsed all the tardisk policy files",
     "Error in parsing some tardisk policy files"},
    {Stage::kTardisks, "Set all the tardisk labels and policy",
     "Error in setting some tardisk labels and policy"},
    {Stage::kTardisks, nullptr, "Failure in setting default tardisk policy"},
    {Stage::kLabels, "Parsed all file label mappings",
     "Error in parsing some file label mappings."},
    {Stage::kLabels, "Set all file labels", "Error in setting some file labels."},
    {Stage::kNone, nullptr, nullptr},
}};

constexpr const PhaseInfo& InfoOf(Phase phase) { return kPhaseInfo[Index(phase)]; }

// By Stage: what the stage throws when something of it failed.
inline constexpr std::array<const char*, 6> kStageFailure{
    nullptr, "Failure in object policy",          "Failure in domain policy",
    nullptr, "Failure in setting tardisk policy", "Failure in file labels policy"};

constexpr const char* FailureOf(Stage stage) {
  return kStageFailure[static_cast<std::size_t>(stage)];
}

inline constexpr char kSpecifiedTardisksFailure[] = "Failure in setting specified tardisk policy";
inline constexpr char kLabelsFailure[] = "There was a failure in setting file labels";
inline constexpr char kLoadFailure[] = "There were some problems encountered in setting the policy";
inline constexpr char kLoadSuccess[] = "System security policy has been set successfully";

// The phase of each event of a run that no fault disturbed and that began with `first`.
std::vector<Phase> PhasesOf(const std::vector<Event>& events, Phase first);

}  // namespace SecPolicyFaults
