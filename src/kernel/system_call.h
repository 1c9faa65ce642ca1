// The door to the private system calls: the machine's own system-call instruction.
#pragma once

#include <array>

namespace SecPolicy {

using PrivateCallArguments = std::array<long, 5>;

// The two result registers.
struct PrivateCallResult {
  long status;
  long error;  // or what the register held before, from a kernel that does not know the call
};

// Leaves errno as it is.
PrivateCallResult IssueSystemCall(long number, const PrivateCallArguments& arguments);

}  // namespace SecPolicy
