#include "tests/faults/scoreboard.h"

#include <iomanip>
#include <iostream>

namespace SecPolicyFaults {

namespace {

void PrintCell(const std::string& scenario, std::size_t fault, const Cell& cell) {
  if (cell.score.injected == 0 && cell.score.unexplained == 0) return;
  std::cout << std::left << std::setw(28) << scenario << std::setw(22) << kFaults.at(fault).name
            << std::right << std::setw(9) << cell.possible << std::setw(8) << cell.stride
            << std::setw(10) << cell.score.injected << std::setw(13) << cell.score.unexplained
            << "\n";
}

}  // namespace

Score PrintScore(const std::vector<Scenario>& scenarios, const Scoreboard& board) {
  Score total;
  std::cout << std::left << std::setw(28) << "scenario" << std::setw(22) << "fault" << std::right
            << std::setw(9) << "possible" << std::setw(8) << "stride" << std::setw(10) << "injected"
            << std::setw(13) << "unexplained"
            << "\n";
  for (std::size_t scenario = 0; scenario < scenarios.size(); ++scenario) {
    for (std::size_t fault = 0; fault < kFaults.size(); ++fault) {
      const Cell& cell = board.cells.at(scenario).at(fault);
      PrintCell(scenarios[scenario].name, fault, cell);
      total.injected += cell.score.injected;
      total.unexplained += cell.score.unexplained;
    }
  }
  std::cout << total.injected << " faults injected, " << total.unexplained << " unexplained"
            << std::endl;
  return total;
}

}  // namespace SecPolicyFaults
