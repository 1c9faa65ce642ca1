// A failure in a load, and what follows from it.
#pragma once

#include <string>
#include <vector>

#include "tests/faults/load_places.h"
#include "tests/faults/load_report.h"
#include "tests/faults/load_rules.h"

namespace SecPolicyFaults {

struct LoadFailure {
  LoadFailure(const Baseline& undisturbed, const Baseline& comparedWith, const Failure& what)
      : baseline(undisturbed),
        compared(comparedWith),
        cause(what.cause),
        event(what.event),
        failed(undisturbed.At(what.event)),
        phase(undisturbed.phases[what.event]),
        rule(RuleFor(phase, failed)),
        item(ItemAt(undisturbed, what.event)) {}

  // Whether an event of the run that is compared with belongs to the failed item.
  [[nodiscard]] bool IsOfItem(std::size_t other) const {
    return compared.items[other] == baseline.items[event];
  }

  const Baseline& baseline;
  const Baseline& compared;
  const std::string cause;
  const std::size_t event;
  const Event& failed;
  const Phase phase;
  const Rule& rule;
  const std::string item;  // the domain or the policy file
};

// What is logged in each phase.
LoadReport ReportAfter(const LoadFailure& failure);

// The operations; `report` says whether the process ends for want of a domain.
std::vector<DueOperation> OperationsAfter(const LoadFailure& failure, const LoadReport& report);

}  // namespace SecPolicyFaults
