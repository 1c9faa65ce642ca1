// The private system calls.
#pragma once

#include "platform/private_calls.h"

namespace SecPolicy {

// An argument as the kernel takes it: signed numbers widened with their sign, unsigned ones with
// zeros, addresses as they are.
class CallArgument {
 public:
  CallArgument(int value) : value_(value) {}
  CallArgument(unsigned int value) : value_(value) {}
  CallArgument(unsigned long value) : value_(static_cast<long>(value)) {}
  CallArgument(const void* address) : value_(reinterpret_cast<long>(address)) {}

  [[nodiscard]] long Value() const noexcept { return value_; }

 private:
  long value_;
};

// Issues the system call and returns its status, 0 for success. When the kernel also returns an
// error value, errno is set to its negation; otherwise errno is left as it was. Missing arguments
// are 0. A kernel that does not have the call sets errno to ENOSYS and the status to non-zero.
long IssuePrivateCall(ZekCtl::Kernel::PrivateCall number, CallArgument first = 0,
                      CallArgument second = 0, CallArgument third = 0, CallArgument fourth = 0,
                      CallArgument fifth = 0);

}  // namespace SecPolicy
