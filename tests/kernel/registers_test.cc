// What the kernel finds in the registers, and what the library makes of what comes back in them.
#include <cerrno>
#include <cstring>
#include <map>

#include "kernel/domain_calls.h"
#include "kernel/private_call.h"
#include "tests/kernel/kernel_calls.h"
#include "tests/support/host_test.h"
#include "tests/support/scripted_kernel.h"

namespace SecPolicyTest {
namespace {

using ZekCtl::Kernel::PrivateCall;

constexpr int kLowestWorld = -2147483647 - 1;

class RegistersTest : public HostTest {
 protected:
  // The objects whose addresses the calls below pass on.
  std::string name_ = "appDom";
  std::string path_ = "/a";
  std::string other_ = "/b";
  unsigned int cell_ = 0;
  unsigned int ids_[4] = {};
  SecPolicy::ZekAccess_FileRule rules_[2] = {};

  // "NUMBER ARGUMENT..." of the one call that `call` issues: numbers as the 64 bits that they are,
  // addresses by their object, "local" for one of the library's own.
  std::string RegistersOf(const std::function<void()>& call) {
    return Run([&] {
             ScriptedKernel kernel(KernelAnswer{});
             call();
             return kernel.Calls().size() == 1 ? TextOf(kernel.Calls()[0]) : "(not one call)";
           })
        .value;
  }

 private:
  std::string TextOf(const SeenCall& seen) {
    std::string text = std::to_string(seen.number);
    for (std::size_t i = 0; i < 5; ++i) text += " " + TextOf(seen.arguments[i]);
    return text;
  }

  std::string TextOf(std::uint64_t argument) {
    const std::map<std::uint64_t, std::string> objects{{AddressOf(name_.c_str()), "name"},
                                                       {AddressOf(path_.c_str()), "path"},
                                                       {AddressOf(other_.c_str()), "other"},
                                                       {AddressOf(&cell_), "cell"},
                                                       {AddressOf(ids_), "ids"},
                                                       {AddressOf(rules_), "rules"}};
    if (objects.contains(argument)) return objects.at(argument);
    const std::uint64_t half = std::uint64_t{1} << 32;
    // Negative numbers lie at the very end of the range, where no object can.
    if (argument < half || argument >= -half) return std::to_string(static_cast<long>(argument));
    return "local";
  }

  static std::uint64_t AddressOf(const void* object) {
    return reinterpret_cast<std::uint64_t>(object);
  }
};

TEST_F(RegistersTest, DomainAndWorldCallsPassTheirArgumentsInOrder) {
  EXPECT_EQ(RegistersOf([&] { SecPolicy::CreateDomain(name_); }), "16474 name 1 local 0 0");
  EXPECT_EQ(RegistersOf([] { SecPolicy::DestroyDomain(7); }), "16475 7 0 0 0 0");
  EXPECT_EQ(RegistersOf([&] { SecPolicy::RetrieveLeakedDomains(4, ids_, &cell_); }),
            "16485 cell ids 4 0 0");
  EXPECT_EQ(RegistersOf([] { SecPolicy::GetDomainIDForWorld(7); }), "16486 7 local 0 0 0");
  EXPECT_EQ(RegistersOf([] { SecPolicy::GetDomainNameForID(7); }), "16487 7 local 128 0 0");
}

TEST_F(RegistersTest, FileRuleCallsPassTheirArgumentsInOrder) {
  EXPECT_EQ(RegistersOf([&] { SecPolicy::AddFilePolicyBatch(5, 7, rules_, 2, &cell_); }),
            "16480 5 7 rules 2 cell");
  EXPECT_EQ(RegistersOf([&] { SecPolicy::RemoveFilePolicy(5, 7, path_); }), "16477 5 7 path 0 0");
  EXPECT_EQ(RegistersOf([&] { SecPolicy::UpdateFilePolicy(7, path_, 0x13); }),
            "16476 7 path 19 0 0");
  EXPECT_EQ(RegistersOf([&] { SecPolicy::ReplaceFilePolicyVMs(path_, other_); }),
            "16488 path other 0 0 0");
  EXPECT_EQ(RegistersOf([] { SecPolicy::RetrieveNumberOfFilePolicies(7); }), "16479 7 local 0 0 0");
  EXPECT_EQ(RegistersOf([&] { SecPolicy::RetrieveFilePolicies(7, rules_, 2); }),
            "16478 7 rules 2 0 0");
}

TEST_F(RegistersTest, TheLoadersDomainsAreOfThePolicy) {
  EXPECT_EQ(RegistersOf([&] {
              (void)SecPolicy::CreateKernelDomain(name_, ZekCtl::Kernel::DomainOrigin::kPolicy,
                                                  &cell_);
            }),
            "16474 name 0 cell 0 0");
}

TEST_F(RegistersTest, NegativeWorldsAreWidenedWithTheirSign) {
  EXPECT_EQ(RegistersOf([] { SecPolicy::GetDomainIDForWorld(-5); }), "16486 -5 local 0 0 0");
  EXPECT_EQ(RegistersOf([] { SecPolicy::GetDomainIDForWorld(kLowestWorld); }),
            "16486 -2147483648 local 0 0 0");
  EXPECT_EQ(RegistersOf([&] { SecPolicy::AddFilePolicyBatch(-5, 1, rules_, 0, &cell_); }),
            "16480 -5 1 rules 0 cell");
  EXPECT_EQ(RegistersOf([&] { SecPolicy::RemoveFilePolicy(-5, 1, path_); }), "16477 -5 1 path 0 0");
}

TEST_F(RegistersTest, DomainsAreWidenedWithoutASign) {
  EXPECT_EQ(RegistersOf([] { SecPolicy::DestroyDomain(4294967295u); }), "16475 4294967295 0 0 0 0");
  EXPECT_EQ(RegistersOf([&] { SecPolicy::UpdateFilePolicy(2147483648u, path_, 4294967295u); }),
            "16476 2147483648 path 4294967295 0 0");
}

TEST_F(RegistersTest, TheStatusAloneDecidesAndTheErrorValueGivesTheReason) {
  struct Row {
    KernelAnswer answer;
    std::string outcome;  // after an errno of EXDEV
  };
  const std::string denied = "Permission denied";
  const std::string before = "Invalid cross-device link";
  const Row rows[] = {
      {{0, 0}, before},
      {{0, -EACCES}, denied},
      {{1, 0}, "failed: " + before},
      {{1, -EACCES}, "failed: " + denied},
      {{-1000000, -EACCES}, "failed: " + denied},
      {{-4096, -EACCES}, "failed: " + denied},
      {{0x0bad0000, -EACCES}, "failed: " + denied},
      // The value is of 32 bits, whatever the kernel leaves above.
      {{1, 0xfffffff3}, "failed: " + denied},
      {{1, 0x100000000}, "failed: " + before},
      // The one value whose negation has no place in an int stays as it is.
      {{1, -2147483648L}, "failed: Unknown error -2147483648"},
      {{1, 2147483647L}, "failed: Unknown error -2147483647"},
      // An ordinary kernel has no second register.
      {{-ENOSYS, 12345}, "failed: Function not implemented"},
      {{-4095, 0}, "failed: Unknown error 4095"},
      {{-EPERM, -EACCES}, "failed: Operation not permitted"},
  };
  for (const Row& row : rows) {
    const Outcome outcome = Run([&] {
      ScriptedKernel kernel(row.answer);
      errno = EXDEV;
      const long status = SecPolicy::IssuePrivateCall(PrivateCall::kDestroyDomain, 7u);
      const std::string reason = std::strerror(errno);
      if (status != row.answer.status) return std::string("(another status)");
      return (status == 0 ? "" : "failed: ") + reason;
    });
    EXPECT_EQ(outcome.value, row.outcome) << row.answer.status << " " << row.answer.error;
  }
}

TEST_F(RegistersTest, EveryCallTakesItsFailureFromTheStatus) {
  for (const KernelCall& call : KernelCalls()) {
    const Outcome refused = Run([&] {
      ScriptedKernel kernel(KernelAnswer{1, -EACCES});
      call.call();
    });
    EXPECT_EQ(refused.error, call.failure + "Permission denied") << call.name;
    const Outcome done = Run([&] {
      ScriptedKernel kernel(KernelAnswer{0, -EACCES});
      call.call();
      return kernel.Calls().at(0).number;
    });
    EXPECT_EQ(done.error, "") << call.name;
    EXPECT_EQ(done.value, std::to_string(static_cast<long>(call.number))) << call.name;
  }
}

TEST_F(RegistersTest, ANameThatFillsItsBufferEndsWithIt) {
  const Outcome outcome = Run([] {
    ScriptedKernel kernel([](const SeenCall& call) {
      std::memset(call.At<char>(1), 'n', call.arguments[2]);
      return KernelAnswer{};
    });
    return SecPolicy::GetDomainNameForID(7);
  });
  EXPECT_EQ(outcome.value, std::string(127, 'n'));
}

TEST_F(RegistersTest, WithoutTheModuleEveryCallIsNotImplemented) {
  for (const KernelCall& call : KernelCalls()) {
    const Outcome outcome = Run([&] {
      ScriptedKernel kernel(KernelAnswer{-ENOSYS, 4711});
      call.call();
    });
    EXPECT_EQ(outcome.error, call.failure + "Function not implemented") << call.name;
  }
}

}  // namespace
}  // namespace SecPolicyTest
