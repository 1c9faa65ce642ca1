#include "kernel/private_call.h"

#include <cerrno>

namespace SecPolicy {

namespace {

using Arguments = long[5];

struct Result {
  long status;
  long error;
};

// The C library's syscall() would fold the status into errno and lose the second register.
#if defined(__x86_64__)

Result SystemCall(long number, const Arguments& arguments) {
  long status = number;
  long third = arguments[2];
  register long fourth asm("r10") = arguments[3];
  register long fifth asm("r8") = arguments[4];
  asm volatile("syscall"
               : "+a"(status), "+d"(third)
               : "D"(arguments[0]), "S"(arguments[1]), "r"(fourth), "r"(fifth)
               : "rcx", "r11", "memory");
  return {status, third};
}

#elif defined(__aarch64__)

Result SystemCall(long number, const Arguments& arguments) {
  register long call asm("x8") = number;
  register long first asm("x0") = arguments[0];
  register long second asm("x1") = arguments[1];
  register long third asm("x2") = arguments[2];
  register long fourth asm("x3") = arguments[3];
  register long fifth asm("x4") = arguments[4];
  asm volatile("svc #0"
               : "+r"(first), "+r"(second)
               : "r"(call), "r"(third), "r"(fourth), "r"(fifth)
               : "memory", "cc");
  return {first, second};
}

#else
#error "the private system calls are not known for this machine"
#endif

// An ordinary kernel answers a number that it does not know with a negative errno in the first
// register and leaves the second one, which still holds an argument.
bool IsOrdinaryError(long status) { return status >= -4095 && status < 0; }

}  // namespace

long IssuePrivateCall(ZekCtl::Kernel::PrivateCall number, CallArgument first, CallArgument second,
                      CallArgument third, CallArgument fourth, CallArgument fifth) {
  const Result result =
      SystemCall(static_cast<long>(number),
                 {first.Value(), second.Value(), third.Value(), fourth.Value(), fifth.Value()});
  // The error value is 32 bits wide, however the kernel fills the rest of the register.
  const auto error =
      static_cast<int>(IsOrdinaryError(result.status) ? result.status : result.error);
  // Negated as a number without a sign: the lowest value has no negation, and stays what it is.
  if (error != 0) errno = static_cast<int>(0U - static_cast<unsigned int>(error));
  return result.status;
}

}  // namespace SecPolicy
