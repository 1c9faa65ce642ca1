#include "host/gate/trapped_call.h"

namespace StandIn {

#if defined(__x86_64__)

namespace {

constexpr int kArguments[] = {REG_RDI, REG_RSI, REG_RDX, REG_R10, REG_R8, REG_R9};

}  // namespace

long TrappedCall::Number() const { return registers_.gregs[REG_RAX]; }

std::uint64_t TrappedCall::Argument(unsigned int index) const {
  return static_cast<std::uint64_t>(registers_.gregs[kArguments[index]]);
}

void TrappedCall::SetResult(long result) { registers_.gregs[REG_RAX] = result; }

void TrappedCall::SetSecondResult(long result) { registers_.gregs[REG_RDX] = result; }

#elif defined(__aarch64__)

long TrappedCall::Number() const { return static_cast<long>(registers_.regs[8]); }

std::uint64_t TrappedCall::Argument(unsigned int index) const { return registers_.regs[index]; }

void TrappedCall::SetResult(long result) {
  registers_.regs[0] = static_cast<unsigned long>(result);
}

void TrappedCall::SetSecondResult(long result) {
  registers_.regs[1] = static_cast<unsigned long>(result);
}

#else
#error "the gate does not know this machine's registers"
#endif

}  // namespace StandIn
