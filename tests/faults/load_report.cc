#include "tests/faults/load_report.h"

#include <optional>

namespace SecPolicyFaults {

namespace {

class Teller {
 public:
  Teller(const Scenario& scenario, const LoadReport& report, Due& due)
      : scenario_(scenario), report_(report), due_(due) {}

  void Tell() {
    for (Phase phase = scenario_.first; phase != scenario_.behind && !over_; phase = Next(phase)) {
      TellPhase(phase);
    }
    if (over_ || scenario_.family != Family::kLoad) return;
    if (failed_) {
      Throw(kLoadFailure);
    } else {
      Log(false, kLoadSuccess);
    }
  }

 private:
  static Phase Next(Phase phase) { return static_cast<Phase>(Index(phase) + 1); }

  void TellPhase(Phase phase) {
    const PhaseInfo& info = InfoOf(phase);
    if (info.stage == endedStage_) return EndStage(phase);
    const PhaseReport& report = report_.Of(phase);
    due_.log.insert(due_.log.end(), report.lines.begin(), report.lines.end());
    if (phase == Phase::kTardisksDefault && scenario_.behind == Phase::kLabelsParse &&
        scenario_.first == phase) {
      return TellDefaultAlone(report);
    }
    if (phase == Phase::kWellKnown && !report_.missingDomain.empty()) return Terminate();
    if (!report.stageText.empty()) {
      stageText_ = report.stageText;
      endedStage_ = info.stage;
    } else {
      SumUp(phase, report);
    }
    EndStage(phase);
  }

  // SetDefaultTardiskPolicy, called by itself, throws what the stage would log.
  void TellDefaultAlone(const PhaseReport& report) {
    if (report.failed) Throw(InfoOf(Phase::kTardisksDefault).failure);
    if (!report.endedQuietly) return;
    Throw(due_.log.back().pattern);
    due_.log.pop_back();
  }

  void SumUp(Phase phase, const PhaseReport& report) {
    const PhaseInfo& info = InfoOf(phase);
    if (phase == Phase::kLabelsSet && report.failed) Log(true, kLabelsFailure);
    if (report.failed && info.failure != nullptr) {
      Log(true, info.failure);
    } else if (info.success != nullptr) {
      Log(false, info.success);
    }
    // A contradiction fails when the domain is to be set.
    const bool failed = (report.failed && phase != Phase::kDomainsCheck) || report.endedQuietly;
    if (failed) stageText_ = FailureOf(info.stage);
    if (phase == Phase::kTardisksSet && stageText_) Log(true, kSpecifiedTardisksFailure);
  }

  // Says what the stage throws, behind the last of its phases.
  void EndStage(Phase phase) {
    if (InfoOf(Next(phase)).stage == InfoOf(phase).stage || !stageText_) return;
    failed_ = true;
    if (scenario_.family == Family::kLoad) {
      Log(true, *stageText_);
    } else {
      Throw(*stageText_);
    }
    stageText_.reset();
    endedStage_.reset();
  }

  void Terminate() {
    Log(true, report_.missingDomain);
    due_.ending = Ending::kTerminated;
    over_ = true;
  }

  void Throw(const std::string& text) {
    due_.ending = Ending::kThrew;
    due_.text = text;
    over_ = true;
  }

  void Log(bool error, const std::string& text) { due_.log.push_back({error, text}); }

  const Scenario& scenario_;
  const LoadReport& report_;
  Due& due_;
  std::optional<std::string> stageText_;
  std::optional<Stage> endedStage_;
  bool failed_ = false;
  bool over_ = false;
};

}  // namespace

bool IsSummary(Phase phase, const DueLine& line) {
  const PhaseInfo& info = InfoOf(phase);
  const char* const stageFailure = FailureOf(info.stage);
  for (const char* text : {info.success, info.failure, stageFailure, kSpecifiedTardisksFailure,
                           kLabelsFailure, kLoadSuccess}) {
    if (text != nullptr && line.pattern == text) return true;
  }
  return false;
}

LoadReport ReportOf(const Baseline& baseline) {
  LoadReport report;
  for (std::size_t i = 0; i < baseline.run.events.size(); ++i) {
    const Event& event = baseline.At(i);
    if (event.kind != EventKind::kInfo && event.kind != EventKind::kError) continue;
    const Phase phase = baseline.phases[i];
    const DueLine line = LineOf(event);
    PhaseReport& ofPhase = report.Of(phase);
    const char* const failure = InfoOf(phase).failure;
    if (failure != nullptr && line.pattern == failure) ofPhase.failed = true;
    if (!IsSummary(phase, line)) ofPhase.lines.push_back(line);
  }
  return report;
}

void Tell(const Scenario& scenario, const LoadReport& report, Due& due) {
  Teller(scenario, report, due).Tell();
}

}  // namespace SecPolicyFaults
