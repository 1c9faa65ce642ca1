// The ids of the domains without which a host must not go on.
#pragma once

namespace SecPolicy {

struct WellKnownDomains {
  unsigned int globalVM = 0;
  unsigned int ioFilter = 0;
  unsigned int defaultTardisk = 0;
};

// Those that a load found last; zeros before. Written by LoadPolicy alone.
WellKnownDomains& KnownDomains() noexcept;

}  // namespace SecPolicy
