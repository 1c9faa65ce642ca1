#include "kernel/system_call.h"

namespace SecPolicy {

// The C library's syscall() would fold the status into errno and lose the second register.
//
// The arguments are copied first: an instrumented load between two register variables is a call,
// which may overwrite the first of them.
#if defined(__x86_64__)

PrivateCallResult IssueSystemCall(long number, const PrivateCallArguments& arguments) {
  long status = number;
  auto [first, second, third, fourthValue, fifthValue] = arguments;
  register long fourth asm("r10") = fourthValue;
  register long fifth asm("r8") = fifthValue;
  asm volatile("syscall"
               : "+a"(status), "+d"(third)
               : "D"(first), "S"(second), "r"(fourth), "r"(fifth)
               : "rcx", "r11", "memory");
  return {status, third};
}

#elif defined(__aarch64__)

PrivateCallResult IssueSystemCall(long number, const PrivateCallArguments& arguments) {
  const auto [firstValue, secondValue, thirdValue, fourthValue, fifthValue] = arguments;
  register long call asm("x8") = number;
  register long first asm("x0") = firstValue;
  register long second asm("x1") = secondValue;
  register long third asm("x2") = thirdValue;
  register long fourth asm("x3") = fourthValue;
  register long fifth asm("x4") = fifthValue;
  asm volatile("svc #0"
               : "+r"(first), "+r"(second)
               : "r"(call), "r"(third), "r"(fourth), "r"(fifth)
               : "memory", "cc");
  return {first, second};
}

#else
#error "the private system calls are not known for this machine"
#endif

}  // namespace SecPolicy
