#include "tests/faults/run.h"

#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <exception>
#include <new>
#include <stdexcept>

#include "secpolicy/secpolicy.h"
#include "tests/support/counted_memory.h"
#include "tests/support/open_descriptors.h"

namespace SecPolicyFaults {

using SecPolicyTest::LiveMemory;
using SecPolicyTest::MemoryUse;
using SecPolicyTest::OwnMemory;

namespace {

void RecordEnding(Ending ending, std::string_view text) noexcept {
  std::string line(1, static_cast<char>('0' + static_cast<int>(ending)));
  Record(EventKind::kEnding, line.append(text));
}

void RecordException() try { throw; } catch (const SecPolicy::SecPolicyRetryException& failure) {
  RecordEnding(Ending::kRetry, failure.what());
} catch (const Tavon::Lib::TavonException& failure) {
  RecordEnding(Ending::kThrew, failure.what());
} catch (const std::bad_alloc&) {
  RecordEnding(Ending::kOutOfMemory, "");
} catch (const std::exception& failure) {
  RecordEnding(Ending::kOther, failure.what());
}

void RunWatched(const Scenario& scenario, const Fault* fault, const MissingPolicy* missing) {
  const Watching watching(fault, missing);
  try {
    const std::string value = scenario.run();
    const OwnMemory ownMemory;
    RecordEnding(Ending::kReturned, value);
  } catch (...) {
    const OwnMemory ownMemory;
    RecordException();
  }
}

void RecordState(const Machine& machine) {
  const std::string state = machine.State();
  if (!machine.HasBrokenOff() && state != machine.ReplayedState()) {
    Record(EventKind::kFinding, "what the kernel holds is not what its operations make of it");
  }
  Record(EventKind::kState, state);
}

void RecordDifference(const char* what, long before, long after) {
  if (before == after) return;
  Record(EventKind::kFinding,
         what + (": " + std::to_string(before)) + " before, " + std::to_string(after) + " after");
}

void TakeEvent(Event& event, RunResult& result) {
  switch (event.kind) {
    case EventKind::kEnding:
      result.ending = static_cast<Ending>(event.text[0] - '0');
      result.text = event.text.substr(1);
      break;
    case EventKind::kFinding:
      result.findings.push_back(event.text);
      break;
    case EventKind::kState:
      result.state = event.text;
      break;
    default:
      result.events.push_back(std::move(event));
  }
}

}  // namespace

void Runner::RunOnMachine(const Scenario& scenario, const RunOptions& options) {
  const Machine machine(setting_);
  if (scenario.prepare) scenario.prepare();
  records_.Clear();
  RunWatched(scenario, options.fault, options.missing);
  if (options.again) {
    records_.Clear();
    RunWatched(scenario, nullptr, nullptr);
  }
  if (!options.stateless) RecordState(machine);
}

void Runner::RunHere(const Scenario& scenario, const RunOptions& options) {
  const MemoryUse before = LiveMemory();
  const int openBefore = SecPolicyTest::OpenDescriptors();
  RunOnMachine(scenario, options);
  const MemoryUse after = LiveMemory();
  RecordDifference("blocks of memory", before.blocks, after.blocks);
  RecordDifference("bytes of memory", before.bytes, after.bytes);
  RecordDifference("open descriptors", openBefore, SecPolicyTest::OpenDescriptors());
}

void Runner::RunInChild(const Scenario& scenario, const RunOptions& options) {
  const pid_t child = fork();
  if (child < 0) throw std::runtime_error("no process could be made");
  if (child == 0) {
    std::set_terminate(std::abort);  // as by default, but without a word of it
    RunHere(scenario, options);
    _exit(0);
  }
  int status = 0;
  waitpid(child, &status, 0);
  const bool aborted = WIFSIGNALED(status) && WTERMSIG(status) == SIGABRT;
  if (!aborted && !(WIFEXITED(status) && WEXITSTATUS(status) == 0)) {
    Record(EventKind::kFinding, "the process ended with status " + std::to_string(status));
  }
}

RunResult Runner::Run(const Scenario& scenario, const RunOptions& options) {
  records_.Clear();
  options.inChild ? RunInChild(scenario, options) : RunHere(scenario, options);
  RunResult result;
  for (Event& event : records_.events.Events()) TakeEvent(event, result);
  result.out = records_.out.Text();
  result.err = records_.err.Text();
  for (std::size_t door = 0; door < kDoors; ++door) {
    result.passed[door] = Passed(static_cast<Door>(door));
  }
  return result;
}

}  // namespace SecPolicyFaults
