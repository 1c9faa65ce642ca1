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

// Domain 0 is rootDom, world 0 all worlds, and no rules, no room and no permission are common.
TEST_F(RefusalTest, RefusalWithArgumentsOfZeroIsThrown) {
  static unsigned int cell = 0;
  static SecPolicy::ZekAccess_FileRule rule{"/a", 0};
  struct Row {
    Operation operation;
    void (*call)();
    const char* failure;
  };
  const Row rows[] = {
      {Operation::kDestroyDomain, [] { SecPolicy::DestroyDomain(0); }, "Failed to destroy domain:"},
      {Operation::kWorldDomain, [] { SecPolicy::GetDomainIDForWorld(0); },
       "Unable to get domain ID: "},
      {Operation::kDomainName, [] { SecPolicy::GetDomainNameForID(0); },
       "Unable to get domain name: "},
      {Operation::kLeakedDomains, [] { SecPolicy::RetrieveLeakedDomains(0, nullptr, &cell); },
       "Failed to retrieve leaked domain list:"},
      {Operation::kAddFileRules, [] { SecPolicy::AddFilePolicyBatch(0, 0, &rule, 0, &cell); },
       "Failed to add file policies to domain :0: world ID :0:"},
      {Operation::kRemoveFileRule, [] { SecPolicy::RemoveFilePolicy(0, 0, "/a"); },
       "Failed to remove file policy from domain :0 : world id :0:"},
      {Operation::kUpdateFileRule, [] { SecPolicy::UpdateFilePolicy(0, "/a", 0); },
       "Failed to update file policy: /a: "},
      {Operation::kCountFileRules, [] { SecPolicy::RetrieveNumberOfFilePolicies(0); },
       "Failed to get number of file policies for domain :: 0:"},
      {Operation::kReadFileRules, [] { SecPolicy::RetrieveFilePolicies(0, nullptr, 0); },
       "Failed to retrieve policies from domain:: 0 : "},
  };
  for (const Row& row : rows) {
    FailNothing();
    Fail(row.operation);
    EXPECT_EQ(Run(row.call).error, std::string(row.failure) + "Input/output error");
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
