// What is due after a fault in a load or in one of its stages.
#include <algorithm>

#include "tests/faults/load_report.h"

namespace SecPolicyFaults {

namespace {

// How far a failure goes.
enum class Reach : std::uint8_t {
  kNothing,  // it is mentioned at most
  kItem,     // the file, domain, mapping... is given up; the phase goes on and sums up a failure
  kPhase,    // the rest of the phase is given up
  kStage,    // the stage ends
  kCall,     // the load ends with the failure's own text
};

struct Rule {
  Phase phase;
  const char* what;  // how the failed event begins; "" for every other
  Reach reach;
  // What is logged at once; {cause}, {item} and {tardisk} stand for values.
  std::array<const char*, 2> texts;
};

constexpr char kParseError[] = "Error in parsing policy for domain: {place} : {cause}";

// The first row that fits counts.
constexpr Rule kRules[] = {
    {Phase::kDomainsSet, "prctl ", Reach::kNothing, {"{cause}", nullptr}},
    {Phase::kObjectsRead, "fopen ", Reach::kItem, {"{cause}", nullptr}},
    {Phase::kObjectsRead, "", Reach::kStage, {nullptr, nullptr}},
    {Phase::kObjectsSet, "", Reach::kStage, {"Error in defining some objects", nullptr}},
    {Phase::kDomainNames, "", Reach::kStage, {nullptr, nullptr}},
    {Phase::kDomainsParse, "fopen ", Reach::kItem, {"{cause}", nullptr}},
    {Phase::kDomainsParse, "", Reach::kItem, {kParseError, nullptr}},
    {Phase::kDomainsCheck,
     "",
     Reach::kItem,
     {"Policy constraint error for domain: {item} : {cause}", nullptr}},
    {Phase::kDomainsSet,
     "",
     Reach::kItem,
     {"Error in setting policy for domain: {place} : {cause}", nullptr}},
    {Phase::kWellKnown, "", Reach::kCall, {nullptr, nullptr}},
    {Phase::kTardisksFind, "", Reach::kStage, {nullptr, nullptr}},
    {Phase::kTardisksParse, "find-domain ", Reach::kItem, {kParseError, nullptr}},
    {Phase::kTardisksParse, "", Reach::kItem, {"{cause}", nullptr}},
    {Phase::kTardisksSet, "", Reach::kItem, {"{place} : Tardisk: {tardisk} : {cause}", nullptr}},
    {Phase::kTardisksDefault,
     "set-rule ",
     Reach::kItem,
     {"Failed to set default tardisk rule: ", "{cause}"}},
    {Phase::kTardisksDefault,
     "lookup-label ",
     Reach::kItem,
     {"Failed to set default tardisk label: ", "{cause}"}},
    {Phase::kTardisksDefault,
     "setxattr ",
     Reach::kItem,
     {"Failed to set default tardisk label: ", "{cause}"}},
    {Phase::kTardisksDefault, "", Reach::kPhase, {"{cause}", nullptr}},
    {Phase::kLabelsParse, "opendir ", Reach::kStage, {nullptr, nullptr}},
    {Phase::kLabelsParse, "", Reach::kItem, {"Error parsing file {item}", "{cause}"}},
    {Phase::kLabelsSet, "", Reach::kItem, {"{place} : {cause}", nullptr}},
};

const Rule& RuleFor(Phase phase, const Event& event) {
  return *std::find_if(std::begin(kRules), std::end(kRules), [&](const Rule& rule) {
    return rule.phase == phase && event.text.starts_with(rule.what);
  });
}

// Whether the event is an entry of the log which the phase's report keeps.
bool IsLineOf(const Baseline& baseline, std::size_t event, Phase phase) {
  const EventKind kind = baseline.At(event).kind;
  return baseline.phases[event] == phase &&
         (kind == EventKind::kInfo || kind == EventKind::kError) &&
         !IsSummary(phase, LineOf(baseline.At(event)));
}

std::string BaseName(const std::string& path) { return path.substr(path.rfind('/') + 1); }

// The tardisk or file that a failure in the middle of a label's setting is about.
std::string LabelledPath(const Baseline& baseline, std::size_t event) {
  const bool before = baseline.At(event).text.starts_with("lookup-label ");
  const std::size_t call = before ? baseline.FirstFrom(event, EventKind::kCall, "setxattr ")
                                  : baseline.LastBefore(event + 1, EventKind::kCall, "setxattr ");
  const bool isKnown = call != Baseline::kNowhere && baseline.items[call] == baseline.items[event];
  return isKnown ? WordOf(baseline.At(call), 1) : "{any}";
}

// The domain, or the policy file, that the failure is about.
std::string ItemAt(const Baseline& baseline, std::size_t event) {
  const Phase phase = baseline.phases[event];
  if (phase == Phase::kDomainsCheck) {
    const std::string word = WordOf(baseline.At(event), 1);
    return word.substr(0, word.find(';'));
  }
  if (phase == Phase::kDomainsSet) {
    for (const char* name : {"set-rule ", "add-file-rules "}) {
      for (const std::size_t other : {baseline.FirstFrom(event, EventKind::kOperation, name),
                                      baseline.LastBefore(event, EventKind::kOperation, name)}) {
        if (other != Baseline::kNowhere && baseline.items[other] == baseline.items[event]) {
          return WordOf(baseline.At(other), 1);
        }
      }
    }
    return "";
  }
  const char* const door = phase == Phase::kTardisksParse ? "open " : "fopen ";
  const std::size_t opened = baseline.LastBefore(event + 1, EventKind::kFile, door);
  if (opened == Baseline::kNowhere) return "";
  const std::string path = WordOf(baseline.At(opened), 1);
  return phase == Phase::kDomainsParse ? BaseName(path) : path;
}

// What stands on the line of the policy that the failure is about.
std::vector<std::string> PlaceWordsAt(const Baseline& baseline, std::size_t event) {
  const Event& failed = baseline.At(event);
  const Phase phase = baseline.phases[event];
  if (phase == Phase::kTardisksSet || phase == Phase::kLabelsSet) {
    const std::size_t label =
        baseline.LastBefore(event + 1, EventKind::kOperation, "lookup-label ");
    return {WordOf(baseline.At(label), 2)};
  }
  if (phase == Phase::kDomainsSet && failed.kind == EventKind::kCall) {
    const std::size_t path = baseline.LastBefore(event + 1, EventKind::kCall, "prctl ");
    return {"-r", WordOf(baseline.At(path), 1)};
  }
  if (failed.text.starts_with("find-domain ")) return WordsOf(failed, 1);
  std::vector<std::string> words = WordsOf(failed, 2);
  words.erase(std::find(words.begin(), words.end(), "#"), words.end());
  return words;
}

// Of a rule's operation: the line that it names itself; empty for none.
std::string LineNumberOf(const Event& event) {
  const std::size_t at = event.text.find(" line ");
  return at == std::string::npos ? "" : WordOf({event.kind, 0, event.text.substr(at)}, 1);
}

class DueLoad {
 public:
  DueLoad(const Scenario& scenario, const Baseline& baseline, const Baseline& compared,
          const Failure& failure)
      : scenario_(scenario),
        baseline_(baseline),
        compared_(compared),
        failure_(failure),
        failed_(baseline.At(failure.event)),
        phase_(baseline.phases[failure.event]),
        rule_(RuleFor(phase_, failed_)),
        item_(ItemAt(baseline, failure.event)) {}

  Due Make() {
    if (rule_.reach == Reach::kCall) return EndedCall();
    due_.placeWords = PlaceWordsAt(baseline_, failure_.event);
    report_ = ReportOf(compared_);
    TakeEarlierPhases();
    PutFailure();
    Tell(scenario_, report_, due_);
    ListOperations();
    return std::move(due_);
  }

 private:
  Due EndedCall() {
    Due due{.ending = Ending::kThrew, .text = failure_.cause};
    due.log = LogUpTo(baseline_, failure_.event);
    due.operations = OperationsUpTo(baseline_, failure_.event + 1);
    return due;
  }

  // Up to the failure, everything is as without it, whatever it is compared with.
  void TakeEarlierPhases() {
    const LoadReport undisturbed = ReportOf(baseline_);
    for (std::size_t i = 0; i < Index(phase_); ++i) report_.phases[i] = undisturbed.phases[i];
  }

  [[nodiscard]] std::string Fill(const char* text) const {
    std::string filled = Filled(text, "{cause}", failure_.cause);
    filled = Filled(filled, "{item}", item_);
    filled = Filled(filled, "{tardisk}", LabelledPath(baseline_, failure_.event));
    if (IsInParsing(baseline_, failure_.event)) {
      const unsigned int line = LineParsedAt(baseline_, failure_.event).number;
      return Filled(filled, "{place}", item_ + ": " + std::to_string(line));
    }
    // A rule's operation says its line itself.
    const std::string line = LineNumberOf(failed_);
    const bool isDomain = phase_ == Phase::kDomainsSet;
    return line.empty() || !isDomain ? filled : Filled(filled, "{place}", item_ + ": " + line);
  }

  // How many lines the phase had logged when the failure came.
  [[nodiscard]] std::size_t LinesBefore() const {
    std::size_t lines = 0;
    for (std::size_t i = 0; i < failure_.event; ++i) {
      lines += IsLineOf(baseline_, i, phase_) ? 1 : 0;
    }
    return lines;
  }

  // The lines of the phase behind the failure; what the failed item was to log is not among them.
  [[nodiscard]] std::vector<DueLine> LinesBehind(std::size_t before) const {
    std::vector<DueLine> lines;
    for (std::size_t i = 0; i < compared_.run.events.size(); ++i) {
      if (!IsLineOf(compared_, i, phase_)) continue;
      if (before > 0) {
        --before;
      } else if (!IsLineOfItem(i)) {
        lines.push_back(LineOf(compared_.At(i)));
      }
    }
    return lines;
  }

  [[nodiscard]] bool IsLineOfItem(std::size_t i) const {
    if (rule_.reach != Reach::kItem) return false;
    if (phase_ == Phase::kDomainsSet) {
      const std::string& text = compared_.At(i).text;
      return text.find("domain: " + item_ + ": ") != std::string::npos;
    }
    return compared_.items[i] == baseline_.items[failure_.event];
  }

  void PutFailure() {
    PhaseReport& report = report_.Of(phase_);
    const std::size_t before = LinesBefore();
    const std::vector<DueLine> behind = LinesBehind(before);
    report.lines.resize(before);
    for (const char* text : rule_.texts) {
      if (text != nullptr) report.lines.push_back({rule_.reach != Reach::kNothing, Fill(text)});
    }
    if (rule_.reach == Reach::kPhase) report.endedQuietly = true;
    if (rule_.reach == Reach::kStage) EndStage(report);
    if (rule_.reach == Reach::kNothing || rule_.reach == Reach::kItem) {
      report.lines.insert(report.lines.end(), behind.begin(), behind.end());
    }
    if (phase_ == Phase::kDomainsCheck) MarkDomain();
    Judge();
  }

  // A phase has failed when it has logged an error.
  void Judge() {
    for (std::size_t i = Index(phase_); i < kPhases; ++i) {
      PhaseReport& report = report_.phases[i];
      report.failed =
          !report.endedQuietly && std::any_of(report.lines.begin(), report.lines.end(),
                                              [](const DueLine& line) { return line.error; });
    }
  }

  void EndStage(PhaseReport& report) {
    const bool ofObjects = phase_ == Phase::kObjectsSet;
    report.stageText = ofObjects ? FailureOf(Stage::kObjects) : failure_.cause;
    if (phase_ == Phase::kDomainNames) MissDomain();
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
      if (baseline_.LastBefore(failure_.event, EventKind::kOperation, created) ==
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
        true, "Skipping the policy for domain " + item_ + " due to errors in the policy", true};
    std::erase_if(lines, [&](const DueLine& line) {
      return line.pattern == skipping.pattern ||
             line.pattern.find("domain: " + item_ + ": ") != std::string::npos;
    });
    lines.push_back(skipping);
  }

  // ---- Operations ----

  void ListOperations() {
    for (std::size_t i = 0; i <= failure_.event; ++i) Push(baseline_, i, false);
    PushInner();
    if (due_.ending == Ending::kTerminated) return PushWellKnownSearch();
    const Stage stage = InfoOf(phase_).stage;
    for (std::size_t i = FirstBehind(); i < compared_.run.events.size(); ++i) {
      const Phase phase = compared_.phases[i];
      const bool sameStage = InfoOf(phase).stage == stage;
      if (IsLost(i, phase, sameStage)) continue;
      Push(compared_, i, false);
    }
  }

  // Behind the failure in the run that is compared with: at the next stage if the failure ended its
  // own, at the next file if it ended one.
  [[nodiscard]] std::size_t FirstBehind() const {
    if (rule_.reach != Reach::kStage && &compared_ == &baseline_) return failure_.event + 1;
    std::size_t i = 0;
    while (i < compared_.phases.size() && !IsClosing(compared_.At(i)) && !IsBehind(i)) ++i;
    return i;
  }

  [[nodiscard]] bool IsBehind(std::size_t i) const {
    const Phase phase = compared_.phases[i];
    if (rule_.reach != Reach::kStage) return compared_.items[i] > baseline_.items[failure_.event];
    return Index(phase) > Index(phase_) && InfoOf(phase).stage != InfoOf(phase_).stage;
  }

  static bool IsClosing(const Event& event) { return event.text == "close-interface"; }

  // The operation within the call that failed may have been asked for.
  void PushInner() {
    if (failed_.kind != EventKind::kCall) return;
    for (std::size_t i = failure_.event; baseline_.At(i).kind != EventKind::kCallEnd; ++i) {
      Push(baseline_, i, true);
    }
  }

  [[nodiscard]] bool IsLost(std::size_t i, Phase phase, bool sameStage) const {
    if (IsClosing(compared_.At(i))) return false;
    if (failed_.kind == EventKind::kCall && compared_.calls[i] == failure_.event) return true;
    if (rule_.reach == Reach::kNothing || !sameStage) return false;
    if (rule_.reach == Reach::kPhase) return phase == phase_;
    if (phase == phase_ && phase != Phase::kDomainsCheck) {
      return compared_.items[i] == baseline_.items[failure_.event];
    }
    return phase_ == Phase::kDomainsCheck && phase == Phase::kDomainsSet && IsOfItem(i);
  }

  [[nodiscard]] bool IsOfItem(std::size_t i) const { return ItemAt(compared_, i) == item_; }

  // Up to the domain that is missing.
  void PushWellKnownSearch() {
    due_.operations.push_back({"find-domain globalVMDom"});
    if (report_.missingDomain.find("global VM") != std::string::npos) return;
    due_.operations.push_back({"set-global-vm-domain globalVMDom"});
    due_.operations.push_back({"find-domain ioFilterDom"});
  }

  void Push(const Baseline& from, std::size_t i, bool optional) {
    const Event& event = from.At(i);
    if (event.kind != EventKind::kOperation) return;
    due_.operations.push_back({event.text, optional});
  }

  const Scenario& scenario_;
  const Baseline& baseline_;
  const Baseline& compared_;
  const Failure& failure_;
  const Event& failed_;
  const Phase phase_;
  const Rule& rule_;
  const std::string item_;
  LoadReport report_;
  Due due_;
};

}  // namespace

Due DueOfLoad(const Scenario& scenario, const Baseline& baseline, const Baseline& compared,
              const Fault&, const Failure& failure) {
  return DueLoad(scenario, baseline, compared, failure).Make();
}

}  // namespace SecPolicyFaults
