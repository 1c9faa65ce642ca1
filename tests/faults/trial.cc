#include "tests/faults/trial.h"

#include <memory>

#include "tests/faults/check.h"
#include "tests/faults/label_sync_order.h"

namespace SecPolicyFaults {

namespace {

void Append(const std::vector<std::string>& from, std::vector<std::string>& to) {
  to.insert(to.end(), from.begin(), from.end());
}

}  // namespace

std::vector<std::string> Trial::UndisturbedFindings() const {
  std::vector<std::string> findings = baseline_.run.findings;
  Append(WrongLabelCalls(baseline_.run), findings);
  return findings;
}

std::vector<std::string> Trial::Try(const Fault& fault, bool repeat) {
  const bool mayTerminate = MayTerminate(scenario_, baseline_, fault);
  const Comparison comparison = ComparisonFor(scenario_, baseline_, fault);
  RunOptions options{.inChild = mayTerminate, .stateless = true};
  std::unique_ptr<Baseline> compared;
  if (comparison.needed) {
    options.fault = comparison.gently.gently ? &comparison.gently : nullptr;
    options.missing = &comparison.missing;
    compared = std::make_unique<Baseline>(runner_.Run(scenario_, options), scenario_.first);
  }
  const Due due = DueAfter(scenario_, baseline_, compared ? *compared : baseline_, fault);
  const RunResult& like = fault.kind == FaultKind::kReadDirectory || fault.kind == FaultKind::kRead
                              ? compared->run
                              : baseline_.run;
  // To look at the example's state takes longer than to make it.
  const bool stateless = !repeat && scenario_.host == HostKind::kExample;
  const RunOptions disturbed{.fault = &fault, .inChild = mayTerminate, .stateless = stateless};
  std::vector<std::string> findings =
      Differences(scenario_, like, due, runner_.Run(scenario_, disturbed));
  if (repeat) Repeat(fault, mayTerminate, findings);
  return findings;
}

void Trial::Repeat(const Fault& fault, bool mayTerminate, std::vector<std::string>& findings) {
  Append(DifferencesFromUndisturbed(baseline_.run, runner_.Run(scenario_, {})), findings);
  if (mayTerminate || !LeavesSame(fault)) return;
  const RunResult run = runner_.Run(scenario_, {.fault = &fault, .again = true});
  Append(DifferencesWhenRepeated(baseline_.run, run), findings);
}

// Whether a repetition on the state that the fault left leads to the same state. Objects, and
// domains, that come later than others get other ids; so do a tardisk's rules another order; and
// of a policy with mistakes, a fault can let by what a mistake would have kept out.
bool Trial::LeavesSame(const Fault& fault) const {
  const bool isGood = baseline_.run.ending == Ending::kReturned;
  if (scenario_.family != Family::kLoad || !isGood) return false;
  if (fault.kind == FaultKind::kReadDirectory || fault.kind == FaultKind::kRead) return false;
  const std::size_t event = baseline_.EventOf(fault);
  if (event == Baseline::kNowhere) return true;
  const Stage stage = InfoOf(baseline_.phases[event]).stage;
  return stage != Stage::kObjects && stage != Stage::kTardisks;
}

}  // namespace SecPolicyFaults
