// The text that a failure has by itself, before anything is put in front of it.
#include <cerrno>
#include <cstring>

#include "tests/faults/due.h"

namespace SecPolicyFaults {

namespace {

std::string ReasonOf(const Fault& fault) {
  switch (fault.kind) {
    case FaultKind::kSilentCall:
      return "{any}";  // of an error that was before
    case FaultKind::kOrdinaryStatus:
      return std::strerror(ENOSYS);
    case FaultKind::kOutOfMemory:
    case FaultKind::kAllocation:
      return std::strerror(ENOMEM);
    default:
      return std::strerror(EIO);
  }
}

std::string PrivateCallCause(const Scenario& scenario, const Baseline& baseline, std::size_t event,
                             const std::string& reason) {
  if (!scenario.refused.empty()) return Filled(scenario.refused, "{reason}", reason);
  if (baseline.phases[event] == Phase::kDomainNames) {
    const std::size_t sought = baseline.LastBefore(event, EventKind::kOperation, "find-domain ");
    return "Failed to create domain: " + WordOf(baseline.At(sought), 1);
  }
  return "Failed to add file policies to domain :{any}: world ID :0:" + reason;
}

std::string CallCause(const Scenario& scenario, const Baseline& baseline, std::size_t event,
                      const std::string& reason) {
  const std::string name = WordOf(baseline.At(event), 0);
  const std::string path = WordOf(baseline.At(event), 1);
  if (name == "setxattr") {
    const std::size_t label = baseline.LastBefore(event, EventKind::kOperation, "lookup-label ");
    return "Unable to set file label (" + WordOf(baseline.At(label), 2) + ") for file " + path +
           ": " + reason;
  }
  if (name == "getxattr") return "Unable to get file label for file " + path + ":" + reason;
  if (name == "prctl") return "Getting realpath failed: " + path;
  return PrivateCallCause(scenario, baseline, event, reason);
}

std::string OpenDirectoryCause(const std::string& path, Phase phase) {
  if (path == "/tardisks/") return "Could not open tardisk dir " + path;
  if (phase == Phase::kTardisksFind) {
    return "Unable to open policy directory for tardisks " + path;
  }
  if (phase == Phase::kLabelsSet) return "Unable to open directory " + path;
  return "Unable to open policy directory " + path;
}

std::string FileCause(const Baseline& baseline, std::size_t event) {
  const std::string name = WordOf(baseline.At(event), 0);
  const std::string path = WordOf(baseline.At(event), 1);
  if (name == "opendir") return OpenDirectoryCause(path, baseline.phases[event]);
  if (name == "fstat") {
    const std::size_t opened = baseline.LastBefore(event, EventKind::kFile, "open ");
    return "Unable to get attributes for policy file " + WordOf(baseline.At(opened), 1);
  }
  return "Unable to open policy file " + path;
}

}  // namespace

Failure FailureAt(const Scenario& scenario, const Baseline& baseline, std::size_t event,
                  const Fault& fault) {
  const std::size_t call = baseline.calls[event];
  if (call != Baseline::kNowhere) {
    return {call, CallCause(scenario, baseline, call, ReasonOf(fault))};
  }
  if (baseline.At(event).kind == EventKind::kFile) return {event, FileCause(baseline, event)};
  return {event, kRefusalText};
}

}  // namespace SecPolicyFaults
