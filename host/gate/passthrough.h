// The one place whose system calls the gate lets by.
#pragma once

#include <cstdint>

namespace StandIn {

// Carries out a system call that would be trapped elsewhere. Returns the kernel's result: a
// negative errno for a failure.
extern "C" long SecpolicyGatePassThrough(long number, const std::uint64_t* arguments);

// The address behind the system-call instruction of the function above: what the kernel reports as
// the place of its calls.
extern "C" const char kSecpolicyGatePassThroughReturn[];

}  // namespace StandIn
