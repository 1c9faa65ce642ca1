#include "tests/faults/baseline.h"

#include <sstream>
#include <utility>

namespace SecPolicyFaults {

namespace {

std::vector<std::size_t> CallsOf(const std::vector<Event>& events) {
  std::vector<std::size_t> calls;
  std::size_t call = Baseline::kNowhere;
  for (std::size_t i = 0; i < events.size(); ++i) {
    if (events[i].kind == EventKind::kCall) call = i;
    calls.push_back(call);
    if (events[i].kind == EventKind::kCallEnd) call = Baseline::kNowhere;
  }
  return calls;
}

bool StartsWith(const Event& event, EventKind kind, const char* text) {
  return event.kind == kind && event.text.starts_with(text);
}

// The domain that an operation of the phase which sets rules is about; empty when it says none.
std::string DomainOf(const Event& event) {
  const bool says = StartsWith(event, EventKind::kOperation, "set-rule ") ||
                    StartsWith(event, EventKind::kOperation, "add-file-rules ");
  return says ? WordOf(event, 1) : "";
}

// The domain of an event that sets a rule: its own or, where it says none, that of the operation
// which follows it.
std::string DomainAround(const std::vector<Event>& events, std::size_t i) {
  for (; i < events.size() && events[i].kind != EventKind::kError; ++i) {
    const std::string domain = DomainOf(events[i]);
    if (!domain.empty()) return domain;
  }
  return "";
}

// Walks over the events and says at which a new item begins.
class ItemStarts {
 public:
  explicit ItemStarts(const std::vector<Event>& events) : events_(events) {}

  bool StartsAt(std::size_t i, Phase phase) {
    const Event& event = events_[i];
    if (StartsWith(event, EventKind::kFile, "opendir ")) ++depth_;
    if (StartsWith(event, EventKind::kFile, "closedir ")) --depth_;
    switch (phase) {
      case Phase::kDomainsParse:
      case Phase::kLabelsParse:
      case Phase::kObjectsRead:
        return StartsWith(event, EventKind::kFile, "fopen ");
      case Phase::kTardisksFind:
      case Phase::kTardisksParse:
        return StartsWith(event, EventKind::kFile, "open ");
      case Phase::kDomainsCheck:
        return event.kind == EventKind::kOperation;
      case Phase::kDomainsSet:
        return IsOtherDomain(DomainAround(events_, i));
      case Phase::kTardisksSet:
      case Phase::kTardisksDefault:
      case Phase::kLabelsSet:
        return depth_ == 0 && StartsWith(event, EventKind::kOperation, "lookup-label ");
      default:
        return false;
    }
  }

 private:
  // What names no domain belongs to the last one that was named.
  bool IsOtherDomain(const std::string& domain) {
    if (domain.empty()) return false;
    return std::exchange(domain_, domain) != domain;
  }

  const std::vector<Event>& events_;
  int depth_ = 0;
  std::string domain_;
};

std::vector<std::size_t> ItemsOf(const std::vector<Event>& events,
                                 const std::vector<Phase>& phases) {
  std::vector<std::size_t> items;
  ItemStarts starts(events);
  std::size_t item = 0;
  for (std::size_t i = 0; i < events.size(); ++i) {
    const bool otherPhase = i > 0 && phases[i] != phases[i - 1];
    if (starts.StartsAt(i, phases[i]) || otherPhase) ++item;
    items.push_back(item);
  }
  return items;
}

}  // namespace

Baseline::Baseline(RunResult undisturbed, Phase first)
    : run(std::move(undisturbed)),
      phases(PhasesOf(run.events, first)),
      items(ItemsOf(run.events, phases)),
      calls(CallsOf(run.events)) {}

std::size_t Baseline::EventOf(const Fault& fault) const {
  const Door door = InfoOf(fault.kind).door;
  std::uint64_t number = 0;
  for (std::size_t i = 0; i < run.events.size(); ++i) {
    const Event& event = run.events[i];
    if (door == Door::kMemory) {
      const bool inCall = event.kind == EventKind::kCallEnd && calls[i] != kNowhere &&
                          At(calls[i]).allocations <= fault.number &&
                          fault.number < event.allocations;
      if (inCall) return calls[i];
    } else if (DoorOf(event) == door && number++ == fault.number) {
      return i;
    }
  }
  return kNowhere;
}

std::size_t Baseline::LastBefore(std::size_t event, EventKind kind,
                                 const std::string& start) const {
  while (event-- > 0) {
    if (StartsWith(At(event), kind, start.c_str())) return event;
  }
  return kNowhere;
}

std::size_t Baseline::FirstFrom(std::size_t event, EventKind kind, const std::string& start) const {
  for (; event < run.events.size(); ++event) {
    if (StartsWith(At(event), kind, start.c_str())) return event;
  }
  return kNowhere;
}

std::optional<Door> DoorOf(const Event& event) {
  struct Row {
    EventKind kind;
    const char* start;
    Door door;
  };
  static constexpr Row kRows[] = {
      {EventKind::kOperation, "", Door::kOperation},
      {EventKind::kCall, "private ", Door::kPrivateCall},
      {EventKind::kCall, "prctl ", Door::kResolvePath},
      {EventKind::kCall, "setxattr ", Door::kSetAttribute},
      {EventKind::kCall, "getxattr ", Door::kGetAttribute},
      {EventKind::kFile, "opendir ", Door::kOpenDirectory},
      {EventKind::kFile, "readdir ", Door::kReadDirectory},
      {EventKind::kFile, "open ", Door::kOpen},
      {EventKind::kFile, "fstat", Door::kStatus},
      {EventKind::kFile, "fopen ", Door::kOpenStream},
      {EventKind::kFile, "read", Door::kRead},
  };
  for (const Row& row : kRows) {
    if (StartsWith(event, row.kind, row.start)) return row.door;
  }
  return std::nullopt;
}

std::vector<std::string> WordsOf(const Event& event, std::size_t skipped) {
  std::istringstream text(event.text);
  std::vector<std::string> words;
  for (std::string word; text >> word;) {
    if (skipped > 0) {
      --skipped;
    } else {
      words.push_back(word);
    }
  }
  return words;
}

std::string WordOf(const Event& event, std::size_t index) {
  const std::vector<std::string> words = WordsOf(event, index);
  return words.empty() ? "" : words.front();
}

}  // namespace SecPolicyFaults
