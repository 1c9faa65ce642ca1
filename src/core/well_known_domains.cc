#include "core/well_known_domains.h"

namespace SecPolicy {

namespace {

WellKnownDomains ofThisProcess;

}  // namespace

WellKnownDomains& KnownDomains() noexcept { return ofThisProcess; }

}  // namespace SecPolicy
