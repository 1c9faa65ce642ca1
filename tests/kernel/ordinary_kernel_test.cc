// An ordinary kernel, in a process that has entered no host.
#include <sys/syscall.h>
#include <unistd.h>

#include <cerrno>

#include "kernel/path_resolution.h"
#include "tests/kernel/kernel_calls.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTest {
namespace {

using StandIn::MessageOf;
using Tavon::Lib::TavonException;

bool NeedsTheInterface(const KernelCall& call) {
  return call.operation == StandIn::Operation::kCreateDomain ||
         call.operation == StandIn::Operation::kDestroyDomain;
}

TEST(OrdinaryKernelTest, PrivateCallsAreNotImplemented) {
  for (const KernelCall& call : KernelCalls()) {
    if (NeedsTheInterface(call)) continue;
    if (syscall(static_cast<long>(call.number)) == 0 || errno != ENOSYS) {
      GTEST_SKIP() << "something answers unknown system calls here with " << errno;
    }
    EXPECT_EQ(MessageOf<TavonException>(call.call), call.failure + "Function not implemented");
  }
}

TEST(OrdinaryKernelTest, TheInterfaceCannotBeOpened) {
  for (const KernelCall& call : KernelCalls()) {
    if (!NeedsTheInterface(call)) continue;
    EXPECT_EQ(MessageOf<TavonException>(call.call),
              "the kernel's security module cannot be reached: no host has been entered")
        << call.name;
  }
}

TEST(OrdinaryKernelTest, PathsAreNotResolved) {
  SecPolicy::ZekAccess_FileRule rule{};
  EXPECT_FALSE(SecPolicy::ResolvePath("/", rule));
}

}  // namespace
}  // namespace SecPolicyTest
