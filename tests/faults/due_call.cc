// What is due after a fault in a display or in a call that stands alone.
#include <algorithm>

#include "tests/faults/due.h"

namespace SecPolicyFaults {

namespace {

enum class CallReach : std::uint8_t {
  kOneType,    // a type of a domain's rules is logged and not shown
  kOneDomain,  // a domain is not shown, and the display ends behind the domains
  kTardisk,    // a tardisk's label is logged and not shown
  kCall,
};

struct CallRule {
  const char* scenario;  // "" for every one
  const char* what;
  CallReach reach;
};

// The first row that fits counts; an event that none fits ends the display.
constexpr CallRule kRules[] = {
    {"", "get-rules ", CallReach::kOneType},
    {"", "read-file-rules ", CallReach::kOneType},
    {"display-one-domain", "domain-info ", CallReach::kCall},
    {"display-domain", "domain-info ", CallReach::kCall},
    {"", "domain-info ", CallReach::kOneDomain},
    {"", "getxattr ", CallReach::kTardisk},
    {"", "label-name ", CallReach::kTardisk},
};

constexpr char kDomainsFailure[] = "Error in displaying the policy for some domains";

CallReach ReachOf(const Scenario& scenario, const Event& event) {
  for (const CallRule& rule : kRules) {
    const bool fits = rule.scenario[0] == '\0' || scenario.name == rule.scenario;
    if (fits && event.text.starts_with(rule.what)) return rule.reach;
  }
  return CallReach::kCall;
}

void PushOperations(const Baseline& baseline, std::size_t first, std::size_t last, Due& due) {
  for (std::size_t i = first; i < last; ++i) {
    const Event& event = baseline.At(i);
    if (event.kind == EventKind::kOperation) due.operations.push_back({event.text});
  }
}

// Everything but what the failed event leads to, up to `end`.
void GoOn(const Baseline& baseline, std::size_t failed, std::size_t next, std::size_t end,
          Due& due) {
  due.out = Output::kSomeLines;
  PushOperations(baseline, 0, failed + 1, due);
  for (std::size_t i = failed; i < next; ++i) {
    // The operation within a trapped call may have been asked for.
    if (baseline.At(i).kind == EventKind::kOperation && baseline.calls[i] == failed) {
      due.operations.push_back({baseline.At(i).text, true});
    }
  }
  PushOperations(baseline, next, end, due);
}

Due EndedAt(const Baseline& baseline, const Failure& failure) {
  Due due{.ending = Ending::kThrew, .text = failure.cause};
  due.log = LogUpTo(baseline, failure.event);
  due.operations = OperationsUpTo(baseline, failure.event + 1);
  due.out = Output::kBeginning;
  const Event& failed = baseline.At(failure.event);
  if (failed.kind != EventKind::kCall) return due;
  const std::size_t inner = baseline.FirstFrom(failure.event, EventKind::kOperation, "");
  if (inner == Baseline::kNowhere || baseline.calls[inner] != failure.event) return due;
  const bool closes = !due.operations.empty() && due.operations.back().text == "close-interface";
  due.operations.insert(due.operations.end() - (closes ? 1 : 0), {baseline.At(inner).text, true});
  return due;
}

// The tardisk whose label was being read.
std::string TardiskAt(const Baseline& baseline, std::size_t event) {
  const std::size_t call = baseline.LastBefore(event + 1, EventKind::kCall, "getxattr ");
  return WordOf(baseline.At(call), 1);
}

void LogFailure(const std::string& text, const Baseline& baseline, std::size_t event, Due& due) {
  due.log = LogUpTo(baseline, event);
  due.log.push_back({true, text});
  const std::vector<DueLine> all = LogUpTo(baseline, baseline.run.events.size());
  due.log.insert(due.log.end(), all.begin() + static_cast<std::ptrdiff_t>(due.log.size() - 1),
                 all.end());
}

std::size_t FirstOf(const Baseline& baseline, std::size_t from,
                    const std::vector<std::string>& starts) {
  std::size_t first = baseline.run.events.size();
  for (const std::string& start : starts) {
    first = std::min(first, baseline.FirstFrom(from, EventKind::kOperation, start));
  }
  return first;
}

}  // namespace

Due DueOfDisplay(const Scenario& scenario, const Baseline& baseline, const Failure& failure) {
  Due due;
  const std::size_t end = baseline.run.events.size();
  const std::size_t failed = failure.event;
  switch (ReachOf(scenario, baseline.At(failed))) {
    case CallReach::kOneType:
      GoOn(baseline, failed, failed + 1, end, due);
      LogFailure(failure.cause, baseline, failed, due);
      return due;
    case CallReach::kOneDomain: {
      const std::size_t next =
          FirstOf(baseline, failed + 1, {"domain-info ", "words ", "close-interface"});
      const std::size_t behind = FirstOf(baseline, failed + 1, {"words ", "close-interface"});
      GoOn(baseline, failed, next, behind, due);
      due.operations.push_back({"close-interface"});
      due.ending = Ending::kThrew;
      due.text = kDomainsFailure;
      return due;
    }
    case CallReach::kTardisk: {
      const std::size_t behind = baseline.FirstFrom(failed, EventKind::kOperation, "label-name ");
      GoOn(baseline, failed, behind + 1, end, due);
      LogFailure(
          "Error in reading tardisk label: (" + TardiskAt(baseline, failed) + "): " + failure.cause,
          baseline, failed, due);
      return due;
    }
    case CallReach::kCall:
      break;
  }
  return EndedAt(baseline, failure);
}

Due DueOfCall(const Scenario&, const Baseline& baseline, const Fault& fault,
              const Failure& failure) {
  Due due = EndedAt(baseline, failure);
  constexpr char kReadRules[] = "private 16478";
  if (fault.kind == FaultKind::kTooSmall && baseline.At(failure.event).text == kReadRules) {
    due.ending = Ending::kRetry;
  }
  return due;
}

}  // namespace SecPolicyFaults
