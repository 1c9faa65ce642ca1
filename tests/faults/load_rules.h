// What a failure in a load leads to, phase by phase.
#pragma once

#include <array>
#include <cstdint>

#include "tests/faults/load_phase.h"

namespace SecPolicyFaults {

// How far a failure goes.
enum class Reach : std::uint8_t {
  kNothing,  // it is mentioned at most
  kItem,     // the file, domain, mapping... is given up; the phase goes on and sums up a failure
  kPhase,    // the rest of the phase is given up
  kStage,    // the stage ends
  kCall,     // the load ends with the failure's own text
};

struct Rule {
  Phase phase;
  const char* what;  // how the failed event begins; "" for every other
  Reach reach;
  // What is logged at once; {cause}, {item} and {tardisk} stand for values.
  std::array<const char*, 2> texts;
};

// The rule for this event's failure.
const Rule& RuleFor(Phase phase, const Event& event);

}  // namespace SecPolicyFaults
