// Comparing what came with what was due.
#pragma once

#include <string>
#include <vector>

#include "tests/faults/due.h"

namespace SecPolicyFaults {

// What is not as it is due; empty when everything is.
std::vector<std::string> Differences(const Scenario& scenario, const RunResult& undisturbed,
                                     const Due& due, const RunResult& run);

// What distinguishes a second run, undisturbed, from the first undisturbed one.
std::vector<std::string> DifferencesFromUndisturbed(const RunResult& undisturbed,
                                                    const RunResult& run);

// The same for a run on the state that a fault left: what the kernel has already need not be made
// again, but what it holds at the end, and what is logged, is the same.
std::vector<std::string> DifferencesWhenRepeated(const RunResult& undisturbed,
                                                 const RunResult& run);

}  // namespace SecPolicyFaults
