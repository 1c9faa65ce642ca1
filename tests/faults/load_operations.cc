// The operations on the kernel when something fails in a load.
#include "tests/faults/load_failure.h"

namespace SecPolicyFaults {

namespace {

class OperationLister {
 public:
  OperationLister(const LoadFailure& failure, const LoadReport& report)
      : failure_(failure), report_(report) {}

  std::vector<DueOperation> Make() {
    List();
    return std::move(operations_);
  }

 private:
  void List() {
    for (std::size_t i = 0; i <= failure_.event; ++i) Push(failure_.baseline, i, false);
    PushInner();
    if (!report_.missingDomain.empty()) return PushWellKnownSearch();
    const Stage stage = InfoOf(failure_.phase).stage;
    for (std::size_t i = FirstBehind(); i < failure_.compared.run.events.size(); ++i) {
      const Phase phase = failure_.compared.phases[i];
      const bool sameStage = InfoOf(phase).stage == stage;
      if (IsLost(i, phase, sameStage)) continue;
      Push(failure_.compared, i, false);
    }
  }

  // Behind the failure in the run that is compared with: at the next stage if the failure ended its
  // own, at the next file if it ended one.
  [[nodiscard]] std::size_t FirstBehind() const {
    if (failure_.rule.reach != Reach::kStage && &failure_.compared == &failure_.baseline)
      return failure_.event + 1;
    std::size_t i = 0;
    while (i < failure_.compared.phases.size() && !IsClosing(failure_.compared.At(i)) &&
           !IsBehind(i))
      ++i;
    return i;
  }

  [[nodiscard]] bool IsBehind(std::size_t i) const {
    const Phase phase = failure_.compared.phases[i];
    if (failure_.rule.reach != Reach::kStage)
      return failure_.compared.items[i] > failure_.baseline.items[failure_.event];
    return Index(phase) > Index(failure_.phase) &&
           InfoOf(phase).stage != InfoOf(failure_.phase).stage;
  }

  static bool IsClosing(const Event& event) { return event.text == "close-interface"; }

  // The operation within the call that failed may have been asked for.
  void PushInner() {
    if (failure_.failed.kind != EventKind::kCall) return;
    for (std::size_t i = failure_.event; failure_.baseline.At(i).kind != EventKind::kCallEnd; ++i) {
      Push(failure_.baseline, i, true);
    }
  }

  [[nodiscard]] bool IsLost(std::size_t i, Phase phase, bool sameStage) const {
    if (IsClosing(failure_.compared.At(i))) return false;
    if (failure_.failed.kind == EventKind::kCall && failure_.compared.calls[i] == failure_.event)
      return true;
    if (failure_.rule.reach == Reach::kNothing || !sameStage) return false;
    if (failure_.rule.reach == Reach::kPhase) return phase == failure_.phase;
    if (phase == failure_.phase && phase != Phase::kDomainsCheck) {
      return failure_.IsOfItem(i);
    }
    return failure_.phase == Phase::kDomainsCheck && phase == Phase::kDomainsSet && IsOfDomain(i);
  }

  [[nodiscard]] bool IsOfDomain(std::size_t i) const {
    return ItemAt(failure_.compared, i) == failure_.item;
  }

  // Up to the domain that is missing.
  void PushWellKnownSearch() {
    operations_.push_back({"find-domain globalVMDom"});
    if (report_.missingDomain.find("global VM") != std::string::npos) return;
    operations_.push_back({"set-global-vm-domain globalVMDom"});
    operations_.push_back({"find-domain ioFilterDom"});
  }

  void Push(const Baseline& from, std::size_t i, bool optional) {
    const Event& event = from.At(i);
    if (event.kind != EventKind::kOperation) return;
    operations_.push_back({event.text, optional});
  }

  const LoadFailure& failure_;
  const LoadReport& report_;
  std::vector<DueOperation> operations_;
};

}  // namespace

std::vector<DueOperation> OperationsAfter(const LoadFailure& failure, const LoadReport& report) {
  return OperationLister(failure, report).Make();
}

}  // namespace SecPolicyFaults
