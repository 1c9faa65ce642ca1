#include "tests/faults/worker.h"

#include <unistd.h>

#include <algorithm>
#include <cstdio>

#include "host/module/description_json.h"
#include "host/session/session.h"
#include "tests/faults/call_doors.h"
#include "tests/faults/trial.h"

#if defined(SECPOLICY_ADDRESS_SANITIZER)
#include <sanitizer/lsan_interface.h>
#endif

namespace SecPolicyFaults {

namespace {

// ---- How many of a kind
// --------------------------------------------------------------------------

// The most faults of a kind in a scenario. What is cheap is tried at every call.
std::uint64_t MostFaults(const Scenario& scenario, FaultKind kind, Form form) {
  constexpr std::uint64_t kAll = ~std::uint64_t{0};
  const bool isMemory = InfoOf(kind).door == Door::kMemory;
  const bool isExample = scenario.host == HostKind::kExample;
  if (form == Form::kLong) return isExample && isMemory ? 2000 : kAll;
  if (isExample) return 5;
  if (!isMemory) return kAll;
  return scenario.family == Family::kLoad ? 100 : 12;
}

std::uint64_t StrideFor(std::uint64_t possible, std::uint64_t most) {
  return std::max<std::uint64_t>(1, (possible + most - 1) / std::max<std::uint64_t>(1, most));
}

bool IsChosen(const std::vector<std::string>& names, std::string_view name) {
  return names.empty() || std::find(names.begin(), names.end(), name) != names.end();
}

// Undisturbed repetitions cost more than a fault, and the example's load is large.
bool IsRepeated(const Scenario& scenario, std::uint64_t tried, Form form) {
  const bool isExample = scenario.host == HostKind::kExample;
  const std::uint64_t stride = form == Form::kLong ? (isExample ? 16 : 1) : 4;
  return tried % stride == 0;
}

void Print(const Scenario& scenario, std::string_view fault, std::uint64_t number,
           const std::vector<std::string>& findings) {
  std::string text = "unexplained: --scenario " + scenario.name + " --fault " + std::string(fault) +
                     " --only " + std::to_string(number) + "\n";
  for (const std::string& finding : findings) text += "    " + finding + "\n";
  dprintf(STDOUT_FILENO, "%s", text.c_str());
}

// ---- All of them
// ---------------------------------------------------------------------------------

class Worker {
 public:
  Worker(const Task& task, Scoreboard& board, Runner& runner)
      : task_(task), board_(board), runner_(runner) {}

  void Work() {
    for (; board_.scenario < task_.scenarios.size(); ++board_.scenario) {
      const Scenario& scenario = task_.scenarios[board_.scenario];
      const bool isHere = scenario.host == task_.host;
      if (isHere && IsChosen(task_.options.scenarios, scenario.name)) TryScenario(scenario);
      board_.fault = 0;
      board_.number = 0;
    }
    board_.done = true;
  }

 private:
  void TryScenario(const Scenario& scenario) {
    // What is made on first use is no leak.
    runner_.Run(scenario, {});
    Trial trial(scenario, runner_);
    const std::vector<std::string> undisturbed = trial.UndisturbedFindings();
    if (!undisturbed.empty()) {
      Print(scenario, "none", 0, undisturbed);
      ++board_.cells[board_.scenario][0].score.unexplained;
    }
    for (; board_.fault < kFaults.size(); ++board_.fault, board_.number = 0) {
      if (IsChosen(task_.options.faults, kFaults[board_.fault].name)) {
        TryKind(scenario, trial, static_cast<FaultKind>(board_.fault));
      }
    }
  }

  void TryKind(const Scenario& scenario, Trial& trial, FaultKind kind) {
    Cell& cell = board_.cells[board_.scenario][board_.fault];
    cell.possible = trial.Possible(kind);
    cell.stride = task_.options.stride != 0
                      ? task_.options.stride
                      : StrideFor(cell.possible, MostFaults(scenario, kind, task_.options.form));
    if (task_.options.only) {
      board_.number = *task_.options.only;
      return TryOne(scenario, trial, {kind, board_.number}, cell, true);
    }
    for (; board_.number < cell.possible; board_.number += cell.stride) {
      const bool repeat = IsRepeated(scenario, board_.number / cell.stride, task_.options.form);
      TryOne(scenario, trial, {kind, board_.number}, cell, repeat);
    }
    LookForLeaks(scenario, cell);
  }

  static void TryOne(const Scenario& scenario, Trial& trial, const Fault& fault, Cell& cell,
                     bool repeat) {
    ++cell.score.injected;
    const std::vector<std::string> findings = trial.Try(fault, repeat);
    if (findings.empty()) return;
    ++cell.score.unexplained;
    Print(scenario, InfoOf(fault.kind).name, fault.number, findings);
  }

  // What a ledger of operator new does not see. It stops the whole process, so not at each fault.
  static void LookForLeaks([[maybe_unused]] const Scenario& scenario, [[maybe_unused]] Cell& cell) {
#if defined(SECPOLICY_ADDRESS_SANITIZER)
    if (__lsan_do_recoverable_leak_check() == 0) return;
    ++cell.score.unexplained;
    Print(scenario, "any", 0, {"memory is leaked; see above"});
#endif
  }

  const Task& task_;
  Scoreboard& board_;
  Runner& runner_;
};

// The display asks about every slot for a domain, so there are few.
constexpr char kDescription[] = R"({"format": 1, "limits": {"domains": 40}})";

// Asked for each operation's words, so it does not read /proc.
class ThisProcess final : public StandIn::ProcessTable {
 public:
  StandIn::ProcessIdentity Self() const override { return {getpid(), 1}; }
  bool Runs(const StandIn::ProcessIdentity& process) const override { return process == Self(); }
};

StandIn::SessionOptions OptionsHere() {
  StandIn::SessionOptions options;
#if defined(SECPOLICY_ADDRESS_SANITIZER)
  options.visible.push_back("/proc");  // the search for leaks reads it
#endif
  return options;
}

}  // namespace

void Work(const Task& task, Scoreboard& board) {
  Records records;
  const ThisProcess processes;
  const StandIn::Session session(StandIn::HostDirectory(task.hostDir), OptionsHere());
  const KernelSetting setting{StandIn::ReadDescription(kDescription, "host.json"), processes,
                              *StandIn::Attached()};
  Watch(records);
  WatchCalls();
  Runner runner(setting, records);
  Worker(task, board, runner).Work();
}

}  // namespace SecPolicyFaults
