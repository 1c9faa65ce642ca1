// What the kernel answers to the private system calls.
#pragma once

#include <array>
#include <cstdint>

#include "host/attached_host.h"
#include "host/kernel/caller_memory.h"

namespace StandIn {

// The two values that a private call returns.
struct PrivateAnswer {
  long status = 0;  // 0, or a number in the range of 0x0bad0000
  long error = 0;   // the negated errno, or 0
};

using CallArguments = std::array<std::uint64_t, 6>;

// Whether the number is one of the module's own.
bool IsPrivateCall(long number) noexcept;

// Answers call `number`, whose addresses are those of `memory`. Never throws.
PrivateAnswer AnswerPrivateCall(const AttachedHost& host, long number,
                                const CallArguments& arguments, CallerMemory& memory) noexcept;

// The answer of a kernel that refuses with this errno.
PrivateAnswer Refusal(int number) noexcept;

}  // namespace StandIn
