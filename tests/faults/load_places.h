// What in the policy a failure is about.
#pragma once

#include <string>
#include <vector>

#include "tests/faults/baseline.h"

namespace SecPolicyFaults {

// The tardisk or file whose label was being set; "{any}" when that is not known.
std::string LabelledPath(const Baseline& baseline, std::size_t event);

// The domain, or the policy file.
std::string ItemAt(const Baseline& baseline, std::size_t event);

// What stands on the line of the policy.
std::vector<std::string> PlaceWordsAt(const Baseline& baseline, std::size_t event);

// Of a rule's operation: the line that it names itself; empty for none.
std::string LineNumberOf(const Event& event);

}  // namespace SecPolicyFaults
