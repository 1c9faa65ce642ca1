#include "tests/faults/due.h"

#include <cstring>

namespace SecPolicyFaults {

namespace {

bool IsOperation(const Event& event, const char* name) {
  return event.kind == EventKind::kOperation && WordOf(event, 0) == name;
}

bool IsOpen(const Baseline& baseline, std::size_t count) {
  bool open = false;
  for (std::size_t i = 0; i < count; ++i) {
    if (IsOperation(baseline.At(i), "open-interface")) open = true;
    if (IsOperation(baseline.At(i), "close-interface")) open = false;
  }
  return open;
}

// Memory ran out outside of a trapped call, when `count` events had happened.
Due OutOfMemoryAfter(const Baseline& baseline, std::size_t count) {
  Due due{.ending = Ending::kOutOfMemory};
  due.log = LogUpTo(baseline, count);
  due.operations = OperationsUpTo(baseline, count);
  due.out = Output::kBeginning;
  return due;
}

std::size_t EventsBefore(const Baseline& baseline, std::uint64_t allocation) {
  std::size_t count = 0;
  while (count < baseline.run.events.size() && baseline.At(count).allocations <= allocation) {
    ++count;
  }
  return count;
}

// All memory from an allocation within a trapped call on: the call fails, and so does what would
// say it.
Due ExhaustedIn(const Baseline& baseline, std::size_t call) {
  Due due = OutOfMemoryAfter(baseline, call + 1);
  for (std::size_t i = call; i < baseline.run.events.size() && baseline.calls[i] == call; ++i) {
    if (baseline.At(i).kind == EventKind::kOperation) {
      due.operations.insert(due.operations.end() - (IsOpen(baseline, call) ? 1 : 0),
                            {baseline.At(i).text, true});
    }
  }
  return due;
}

// An interface that could not be opened is not closed.
Due NeverOpened(const Baseline& baseline, std::size_t event, const Fault& fault) {
  Due due{.ending = Ending::kThrew, .text = kRefusalText};
  if (fault.kind == FaultKind::kOutOfMemory) due = {.ending = Ending::kOutOfMemory};
  due.log = LogUpTo(baseline, event);
  due.out = Output::kBeginning;
  due.operations = OperationsUpTo(baseline, event);
  due.operations.push_back({baseline.At(event).text});
  return due;
}

// What is due of a failure that goes by unseen.
Due Undisturbed(const Baseline& baseline) {
  Due due{.ending = baseline.run.ending, .text = baseline.run.text};
  due.log = LogUpTo(baseline, baseline.run.events.size());
  for (const Event& event : baseline.run.events) {
    if (event.kind == EventKind::kOperation) due.operations.push_back({event.text});
  }
  return due;
}

}  // namespace

DueLine LineOf(const Event& event) {
  const bool error = event.kind == EventKind::kError;
  return {error, error ? event.text.substr(std::strlen("Error: ")) : event.text};
}

std::vector<DueLine> LogUpTo(const Baseline& baseline, std::size_t event) {
  std::vector<DueLine> log;
  for (std::size_t i = 0; i < event; ++i) {
    const EventKind kind = baseline.At(i).kind;
    if (kind == EventKind::kInfo || kind == EventKind::kError) {
      log.push_back(LineOf(baseline.At(i)));
    }
  }
  return log;
}

std::vector<DueOperation> OperationsUpTo(const Baseline& baseline, std::size_t count) {
  std::vector<DueOperation> operations;
  for (std::size_t i = 0; i < count; ++i) {
    if (baseline.At(i).kind == EventKind::kOperation) operations.push_back({baseline.At(i).text});
  }
  if (IsOpen(baseline, count)) operations.push_back({"close-interface"});
  return operations;
}

Comparison ComparisonFor(const Scenario& scenario, const Baseline& baseline, const Fault& fault) {
  Comparison comparison;
  if (fault.kind == FaultKind::kReadDirectory || fault.kind == FaultKind::kRead ||
      fault.kind == FaultKind::kOpenStream) {
    return {true, {fault.kind, fault.number, true}, {}};
  }
  const std::size_t event = baseline.EventOf(fault);
  if (event == Baseline::kNowhere) return comparison;
  if (IsInParsing(baseline, event)) {
    const ParsedLine line = LineParsedAt(baseline, event);
    return {true, {}, {.file = line.file, .bytes = line.offset}};
  }
  if (baseline.phases[event] == Phase::kTardisksParse) {
    const std::size_t opened = baseline.LastBefore(event + 1, EventKind::kFile, "open ");
    return {true, {}, {.file = WordOf(baseline.At(opened), 1)}};
  }
  if (scenario.family != Family::kLoad) return comparison;
  const Phase phase = baseline.phases[event];
  if (phase == Phase::kObjectsRead || phase == Phase::kObjectsSet) {
    return {true, {}, {.directory = scenario.policyDir + "/objects"}};
  }
  if (phase == Phase::kDomainNames && !MayTerminate(scenario, baseline, fault)) {
    const std::size_t sought =
        baseline.LastBefore(event + 1, EventKind::kOperation, "find-domain ");
    return {true,
            {},
            {.directory = scenario.policyDir + "/domains",
             .firstName = WordOf(baseline.At(sought), 1)}};
  }
  return comparison;
}

bool MayTerminate(const Scenario& scenario, const Baseline& baseline, const Fault& fault) {
  if (scenario.family != Family::kLoad) return false;
  const std::size_t event = baseline.EventOf(fault);
  if (event == Baseline::kNowhere || baseline.phases[event] != Phase::kDomainNames) return false;
  if (fault.kind == FaultKind::kReadDirectory || fault.kind == FaultKind::kOpenDirectory) {
    return true;
  }
  // In byte order ioFilterDom is the last of the domains that must be there.
  return baseline.LastBefore(event, EventKind::kOperation, "create-domain ioFilterDom ") ==
         Baseline::kNowhere;
}

Due DueAfter(const Scenario& scenario, const Baseline& baseline, const Baseline& compared,
             const Fault& fault) {
  if (fault.kind == FaultKind::kReadDirectory || fault.kind == FaultKind::kRead) {
    return Undisturbed(compared);
  }
  const std::size_t event = baseline.EventOf(fault);
  if (event == Baseline::kNowhere) {
    return OutOfMemoryAfter(baseline, EventsBefore(baseline, fault.number));
  }
  if (IsOperation(baseline.At(event), "close-interface")) return Undisturbed(baseline);
  if (IsOperation(baseline.At(event), "open-interface")) return NeverOpened(baseline, event, fault);
  const bool inCall = baseline.calls[event] != Baseline::kNowhere;
  if (fault.kind == FaultKind::kExhaustion) return ExhaustedIn(baseline, event);
  if (fault.kind == FaultKind::kOutOfMemory && !inCall) {
    return OutOfMemoryAfter(baseline, event + 1);
  }
  const Failure failure = FailureAt(scenario, baseline, event, fault);
  switch (scenario.family) {
    case Family::kLoad:
    case Family::kStage:
      return DueOfLoad(scenario, baseline, compared, failure);
    case Family::kDisplay:
      return DueOfDisplay(scenario, baseline, failure);
    case Family::kCall:
      break;
  }
  return DueOfCall(scenario, baseline, fault, failure);
}

}  // namespace SecPolicyFaults
