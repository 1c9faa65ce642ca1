// What is logged when something fails in a load.
#include <algorithm>

#include "tests/faults/load_failure.h"

namespace SecPolicyFaults {

namespace {

// Whether the event is an entry of the log which the phase's report keeps.
bool IsLineOf(const Baseline& baseline, std::size_t event, Phase phase) {
  const EventKind kind = baseline.At(event).kind;
  return baseline.phases[event] == phase &&
         (kind == EventKind::kInfo || kind == EventKind::kError) &&
         !IsSummary(phase, LineOf(baseline.At(event)));
}

class ReportMaker {
 public:
  explicit ReportMaker(const LoadFailure& failure)
      : failure_(failure), report_(ReportOf(failure.compared)) {}

  LoadReport Make() {
    TakeEarlierPhases();
    PutFailure();
    return std::move(report_);
  }

 private:
  // Up to the failure, everything is as without it, whatever it is compared with.
  void TakeEarlierPhases() {
    const LoadReport undisturbed = ReportOf(failure_.baseline);
    for (std::size_t i = 0; i < Index(failure_.phase); ++i)
      report_.phases[i] = undisturbed.phases[i];
  }

  [[nodiscard]] std::string Fill(const char* text) const {
    std::string filled = Filled(text, "{cause}", failure_.cause);
    filled = Filled(filled, "{item}", failure_.item);
    filled = Filled(filled, "{tardisk}", LabelledPath(failure_.baseline, failure_.event));
    if (IsInParsing(failure_.baseline, failure_.event)) {
      const unsigned int line = LineParsedAt(failure_.baseline, failure_.event).number;
      return Filled(filled, "{place}", failure_.item + ": " + std::to_string(line));
    }
    // A rule's operation says its line itself.
    const std::string line = LineNumberOf(failure_.failed);
    const bool isDomain = failure_.phase == Phase::kDomainsSet;
    return line.empty() || !isDomain ? filled
                                     : Filled(filled, "{place}", failure_.item + ": " + line);
  }

  // How many lines the phase had logged when the failure came.
  [[nodiscard]] std::size_t LinesBefore() const {
    std::size_t lines = 0;
    for (std::size_t i = 0; i < failure_.event; ++i) {
      lines += IsLineOf(failure_.baseline, i, failure_.phase) ? 1 : 0;
    }
    return lines;
  }

  // The lines of the phase behind the failure; what the failed item was to log is not among them.
  [[nodiscard]] std::vector<DueLine> LinesBehind(std::size_t before) const {
    std::vector<DueLine> lines;
    for (std::size_t i = 0; i < failure_.compared.run.events.size(); ++i) {
      if (!IsLineOf(failure_.compared, i, failure_.phase)) continue;
      if (before > 0) {
        --before;
      } else if (!IsLineOfItem(i)) {
        lines.push_back(LineOf(failure_.compared.At(i)));
      }
    }
    return lines;
  }

  [[nodiscard]] bool IsLineOfItem(std::size_t i) const {
    if (failure_.rule.reach != Reach::kItem) return false;
    if (failure_.phase == Phase::kDomainsSet) {
      const std::string& text = failure_.compared.At(i).text;
      return text.find("domain: " + failure_.item + ": ") != std::string::npos;
    }
    return failure_.IsOfItem(i);
  }

  void PutFailure() {
    PhaseReport& report = report_.Of(failure_.phase);
    const std::size_t before = LinesBefore();
    const std::vector<DueLine> behind = LinesBehind(before);
    report.lines.resize(before);
    for (const char* text : failure_.rule.texts) {
      if (text != nullptr)
        report.lines.push_back({failure_.rule.reach != Reach::kNothing, Fill(text)});
    }
    if (failure_.rule.reach == Reach::kPhase) report.endedQuietly = true;
    if (failure_.rule.reach == Reach::kStage) EndStage(report);
    if (failure_.rule.reach == Reach::kNothing || failure_.rule.reach == Reach::kItem) {
      report.lines.insert(report.lines.end(), behind.begin(), behind.end());
    }
    if (failure_.phase == Phase::kDomainsCheck) MarkDomain();
    Judge();
  }

  // A phase has failed when it has logged an error.
  void Judge() {
    for (std::size_t i = Index(failure_.phase); i < kPhases; ++i) {
      PhaseReport& report = report_.phases[i];
      report.failed =
          !report.endedQuietly && std::any_of(report.lines.begin(), report.lines.end(),
                                              [](const DueLine& line) { return line.error; });
    }
  }

  void EndStage(PhaseReport& report) {
    const bool ofObjects = failure_.phase == Phase::kObjectsSet;
    report.stageText = ofObjects ? FailureOf(Stage::kObjects) : failure_.cause;
    if (failure_.phase == Phase::kDomainNames) MissDomain();
  }

  // Without its well-known domains the load ends the process.
  void MissDomain() {
    struct Row {
      const char* domain;
      const char* text;
    };
    static constexpr Row kRows[] = {
        {"globalVMDom", "Failed to fetch domainID for global VM Domain"},
        {"ioFilterDom", "Failed to fetch domainID for IOFilter domain"},
        {"appDom", "Failed to fetch domainID for default tar disk domain"},
    };
    for (const Row& row : kRows) {
      const std::string created = std::string("create-domain ") + row.domain + " ";
      if (failure_.baseline.LastBefore(failure_.event, EventKind::kOperation, created) ==
          Baseline::kNowhere) {
        report_.missingDomain = row.text;
        return;
      }
    }
  }

  // What contradicts itself is not set, which is said when its turn comes.
  void MarkDomain() {
    std::vector<DueLine>& lines = report_.Of(Phase::kDomainsSet).lines;
    const DueLine skipping{
        true, "Skipping the policy for domain " + failure_.item + " due to errors in the policy",
        true};
    std::erase_if(lines, [&](const DueLine& line) {
      return line.pattern == skipping.pattern ||
             line.pattern.find("domain: " + failure_.item + ": ") != std::string::npos;
    });
    lines.push_back(skipping);
  }

  const LoadFailure& failure_;
  LoadReport report_;
};

}  // namespace

LoadReport ReportAfter(const LoadFailure& failure) { return ReportMaker(failure).Make(); }

}  // namespace SecPolicyFaults
