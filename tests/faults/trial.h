// A scenario that is tried with one fault after the other.
#pragma once

#include <string>
#include <vector>

#include "tests/faults/baseline.h"

namespace SecPolicyFaults {

class Trial {
 public:
  // Runs the scenario undisturbed. Both must outlive this object.
  Trial(const Scenario& scenario, Runner& runner)
      : scenario_(scenario), runner_(runner), baseline_(runner.Run(scenario, {}), scenario.first) {}

  // How many faults of the kind there are.
  [[nodiscard]] std::uint64_t Possible(FaultKind kind) const {
    return baseline_.run.passed[static_cast<std::size_t>(InfoOf(kind).door)];
  }

  // What is wrong with the undisturbed run.
  [[nodiscard]] std::vector<std::string> UndisturbedFindings() const;

  // Runs the scenario with the fault; what is not as it is due. With `repeat`, it is run again on a
  // new kernel and, where that makes sense, on what the fault left.
  std::vector<std::string> Try(const Fault& fault, bool repeat);

 private:
  void Repeat(const Fault& fault, bool mayTerminate, std::vector<std::string>& findings);
  [[nodiscard]] bool LeavesSame(const Fault& fault) const;

  const Scenario& scenario_;
  Runner& runner_;
  const Baseline baseline_;
};

}  // namespace SecPolicyFaults
