// What is due after a fault in a load or in one of its stages.
#include "tests/faults/load_failure.h"

namespace SecPolicyFaults {

Due DueOfLoad(const Scenario& scenario, const Baseline& baseline, const Baseline& compared,
              const Failure& failure) {
  if (RuleFor(baseline.phases[failure.event], baseline.At(failure.event)).reach == Reach::kCall) {
    return {.ending = Ending::kThrew,
            .text = failure.cause,
            .log = LogUpTo(baseline, failure.event),
            .operations = OperationsUpTo(baseline, failure.event + 1)};
  }
  const LoadFailure inLoad(baseline, compared, failure);
  LoadReport report = ReportAfter(inLoad);
  if (scenario.family != Family::kLoad) report.missingDomain.clear();  // which a load looks for
  Due due{.operations = OperationsAfter(inLoad, report),
          .placeWords = PlaceWordsAt(baseline, failure.event)};
  Tell(scenario, report, due);
  return due;
}

}  // namespace SecPolicyFaults
