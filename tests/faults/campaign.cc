#include "tests/faults/campaign.h"

#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <iostream>
#include <stdexcept>

#include "tests/faults/campaign_hosts.h"
#include "tests/faults/worker.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyFaults {

namespace {

[[noreturn]] void RunWorker(const Task& task, Scoreboard& board) {
  try {
    Work(task, board);
  } catch (const std::exception& failure) {
    dprintf(STDOUT_FILENO, "the campaign's process failed: %s\n", failure.what());
    _exit(1);
  }
  _exit(0);
}

// Goes on behind the fault at which a process died.
void Bury(const Task& task, Scoreboard& board, int status) {
  Cell& cell = board.cells[board.scenario][board.fault];
  ++cell.score.unexplained;
  std::cout << "unexplained: --scenario " << task.scenarios.at(board.scenario).name << " --fault "
            << kFaults.at(board.fault).name << " --only " << board.number
            << "\n    the process died, status " << status << std::endl;
  board.number += cell.stride;
}

bool HasWork(const Task& task) {
  for (const Scenario& scenario : task.scenarios) {
    if (scenario.host != task.host) continue;
    if (task.options.scenarios.empty()) return true;
    for (const std::string& name : task.options.scenarios) {
      if (scenario.name == name) return true;
    }
  }
  return false;
}

void RunOnHost(const Task& task, Scoreboard& board) {
  constexpr int kMostDeaths = 20;
  MakeHost(task.host, task.hostDir);
  board.scenario = board.fault = 0;
  board.number = 0;
  board.done = false;
  for (int deaths = 0; !board.done && deaths < kMostDeaths; ++deaths) {
    std::cout.flush();
    const pid_t worker = fork();
    if (worker < 0) throw std::runtime_error("no process could be made");
    if (worker == 0) RunWorker(task, board);
    int status = 0;
    waitpid(worker, &status, 0);
    if (status != 0 || !board.done) Bury(task, board, status);
    if (task.options.only && !board.done) return;
  }
}

}  // namespace

Score RunCampaign(const CampaignOptions& options) {
  const StandIn::TemporaryDirectory directory;
  const std::vector<Scenario> scenarios = AllScenarios();
  Scoreboard* const board = Scoreboard::Make();
  for (const HostKind host : {HostKind::kGood, HostKind::kBad, HostKind::kExample}) {
    const std::string name = "host" + std::to_string(static_cast<int>(host));
    const Task task{host, directory / name, scenarios, options};
    if (HasWork(task)) RunOnHost(task, *board);
  }
  return PrintScore(scenarios, *board);
}

}  // namespace SecPolicyFaults
