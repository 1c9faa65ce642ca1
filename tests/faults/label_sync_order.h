// The order in which a synchronisation of labels asks the kernel to change them.
#pragma once

#include <string>
#include <vector>

#include "tests/faults/run.h"

namespace SecPolicyFaults {

// What is wrong with the calls that an undisturbed run makes to change labels. What is due after a
// fault is taken from such a run, so it has to be compared with what is documented: for each type
// of label the invalid ones are asked for, removed together and added together, then the obsolete
// ones are removed together, then the policy's are added together.
std::vector<std::string> WrongLabelCalls(const RunResult& undisturbed);

}  // namespace SecPolicyFaults
