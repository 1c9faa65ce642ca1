// Failed system calls as errors.
#pragma once

#include <cstring>
#include <string>

#include "secpolicy/host/host_error.h"

namespace StandIn {

// The error "FILE: cannot be DONE: REASON", where REASON is the text of errno `number`.
inline HostError SystemFailure(const std::string& file, const char* done, int number) {
  return HostError(file + ": cannot be " + done + ": " + std::strerror(number));
}

}  // namespace StandIn
