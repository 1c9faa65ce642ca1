// What both platform classes need of the attached host.
#pragma once

#include "host/attached_host.h"
#include "host/module/module_error.h"
#include "platform/tavon_exception.h"

namespace StandIn {

// The attached host. Throws Tavon::Lib::TavonException "the kernel's security module cannot be
// reached: no host has been entered".
const AttachedHost& HostInUse();

// Runs `operation`; a refusal by the module leaves it as the platform's exception, with the same
// text.
template <typename Operation>
auto AsPlatform(const Operation& operation) try {
  return operation();
} catch (const ModuleError& refusal) {
  throw Tavon::Lib::TavonException(refusal.what());
}

}  // namespace StandIn
