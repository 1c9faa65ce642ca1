#include "kernel/private_call.h"

#include <cerrno>

#include "kernel/system_call.h"

namespace SecPolicy {

namespace {

// An ordinary kernel answers a number that it does not know with a negative errno in the first
// register and leaves the second one, which still holds an argument.
bool IsOrdinaryError(long status) { return status >= -4095 && status < 0; }

}  // namespace

long IssuePrivateCall(ZekCtl::Kernel::PrivateCall number, CallArgument first, CallArgument second,
                      CallArgument third, CallArgument fourth, CallArgument fifth) {
  const PrivateCallResult result = IssueSystemCall(
      static_cast<long>(number),
      {first.Value(), second.Value(), third.Value(), fourth.Value(), fifth.Value()});
  // The error value is 32 bits wide, however the kernel fills the rest of the register.
  const auto error =
      static_cast<int>(IsOrdinaryError(result.status) ? result.status : result.error);
  // Negated as a number without a sign: the lowest value has no negation, and stays what it is.
  if (error != 0) errno = static_cast<int>(0U - static_cast<unsigned int>(error));
  return result.status;
}

}  // namespace SecPolicy
