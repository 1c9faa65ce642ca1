// One run of a scenario.
#pragma once

#include <array>
#include <string>
#include <vector>

#include "tests/faults/doors.h"
#include "tests/faults/machine.h"
#include "tests/faults/scenario.h"

namespace SecPolicyFaults {

enum class Ending : std::uint8_t { kReturned, kThrew, kRetry, kOutOfMemory, kOther, kTerminated };

struct RunResult {
  std::vector<Event> events;  // operations, calls, files and the log
  std::string out;
  std::string err;
  Ending ending = Ending::kTerminated;
  std::string text;  // the value returned, or the exception's text
  std::string state;
  std::vector<std::string> findings;  // leaks and the like
  std::array<std::uint64_t, kDoors> passed{};
};

struct RunOptions {
  const Fault* fault = nullptr;
  const MissingPolicy* missing = nullptr;
  bool inChild = false;    // for a run that may end its process
  bool stateless = false;  // what the kernel holds in the end is not looked at
  bool again = false;      // runs once more, undisturbed, on the state that the first one left
};

class Runner {
 public:
  Runner(const KernelSetting& setting, Records& records) : setting_(setting), records_(records) {}

  RunResult Run(const Scenario& scenario, const RunOptions& options);

 private:
  void RunHere(const Scenario& scenario, const RunOptions& options);
  void RunInChild(const Scenario& scenario, const RunOptions& options);
  void RunOnMachine(const Scenario& scenario, const RunOptions& options);

  const KernelSetting& setting_;
  Records& records_;
};

}  // namespace SecPolicyFaults
