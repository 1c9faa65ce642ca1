// What is due after a fault: said by rules, from the undisturbed run and the fault alone.
#pragma once

#include <string>
#include <vector>

#include "tests/faults/baseline.h"
#include "tests/faults/pattern.h"

namespace SecPolicyFaults {

struct DueLine {
  bool error = false;
  std::string pattern;    // without "Error: "
  bool floating = false;  // stands somewhere
};

struct DueOperation {
  std::string text;
  bool optional = false;  // within a trapped call that failed
};

// What is to be printed, compared with the undisturbed run.
enum class Output : std::uint8_t { kSame, kBeginning, kSomeLines };

struct Due {
  Ending ending = Ending::kReturned;
  std::string text = {};  // pattern of the exception's text; of a value returned: none counts
  std::vector<DueLine> log = {};
  std::vector<DueOperation> operations = {};
  Output out = Output::kSame;
  std::vector<std::string> placeWords = {};  // what stands on the line that "{place}" names
};

// What a fault is compared with besides the undisturbed run: a policy in which what could not be
// read is not there. Nothing for most faults.
struct Comparison {
  bool needed = false;
  Fault gently;
  MissingPolicy missing;
};
Comparison ComparisonFor(const Scenario& scenario, const Baseline& baseline, const Fault& fault);

// Whether the fault may end its process.
bool MayTerminate(const Scenario& scenario, const Baseline& baseline, const Fault& fault);

// `compared` is the run that ComparisonFor asks for, or the baseline itself.
Due DueAfter(const Scenario& scenario, const Baseline& baseline, const Baseline& compared,
             const Fault& fault);

// ---- The rules of one family each --------------------------------------------------------------

// What fails, as the rules see it.
struct Failure {
  std::size_t event;  // a direct operation, a trapped call, or a call for a file
  std::string cause;  // pattern of the text that the failure has by itself
};

Due DueOfLoad(const Scenario& scenario, const Baseline& baseline, const Baseline& compared,
              const Failure& failure);
Due DueOfDisplay(const Scenario& scenario, const Baseline& baseline, const Failure& failure);
Due DueOfCall(const Scenario& scenario, const Baseline& baseline, const Fault& fault,
              const Failure& failure);

// What fails when the fault befalls the event.
Failure FailureAt(const Scenario& scenario, const Baseline& baseline, std::size_t event,
                  const Fault& fault);

// The log up to an event, as it was.
std::vector<DueLine> LogUpTo(const Baseline& baseline, std::size_t event);
// The operations among the first `count` events and, if it is open then, what closes the interface.
std::vector<DueOperation> OperationsUpTo(const Baseline& baseline, std::size_t count);
DueLine LineOf(const Event& event);

}  // namespace SecPolicyFaults
