// What each call says when the kernel refuses it.
#include <cerrno>

#include "tests/kernel/kernel_calls.h"
#include "tests/support/host_test.h"

namespace SecPolicyTest {
namespace {

class RefusalTest : public HostTest {};

TEST_F(RefusalTest, EachCallEndsItsMessageWithTheReason) {
  struct Row {
    int number;
    const char* reason;
  };
  const Row rows[] = {{EPERM, "Operation not permitted"},   {ENOENT, "No such file or directory"},
                      {ENOMEM, "Cannot allocate memory"},   {ENOSPC, "No space left on device"},
                      {ENAMETOOLONG, "File name too long"}, {4095, "Unknown error 4095"}};
  for (const KernelCall& call : KernelCalls()) {
    for (const Row& row : rows) {
      FailNothing();
      Fail(call.operation, 1, row.number);
      const Outcome outcome = Run(call.call);
      EXPECT_EQ(outcome.error, call.failure + row.reason) << call.name;
    }
  }
}

TEST_F(RefusalTest, RefusalsAreNotLogged) {
  for (const KernelCall& call : KernelCalls()) {
    FailNothing();
    Fail(call.operation);
    const Outcome outcome = Run(call.call);
    EXPECT_EQ(outcome.err + outcome.out, "") << call.name;
    EXPECT_EQ(outcome.events.size(), outcome.Operations().size()) << call.name;
    EXPECT_EQ(outcome.Operations({"open-interface"}).size(),
              outcome.Operations({"close-interface"}).size())
        << call.name;
  }
}

TEST_F(RefusalTest, ARefusalWithoutAnErrorValueQuotesTheErrnoOfBefore) {
  for (const KernelCall& call : KernelCalls()) {
    FailNothing();
    Fail(Fault{.operation = call.operation, .number = 0});
    const Outcome outcome = Run([&] {
      errno = EXDEV;
      call.call();
    });
    EXPECT_EQ(outcome.error, call.failure + "Invalid cross-device link") << call.name;
  }
}

TEST_F(RefusalTest, ARefusedCallChangesNothing) {
  for (const KernelCall& call : KernelCalls()) Fail(call.operation);
  Run([] { SecPolicy::CreateDomain("appDom"); });
  FailNothing();
  EXPECT_EQ(Run([] { return SecPolicy::GetDomainNameForID(1); }).error,
            "Unable to get domain name: No such file or directory");
}

}  // namespace
}  // namespace SecPolicyTest
