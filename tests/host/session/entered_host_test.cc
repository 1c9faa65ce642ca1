// The host as a program sees it that knows its public header alone.
#include "secpolicy/host/entered_host.h"

#include <stdexcept>

#include "secpolicy/secpolicy.h"
#include "tests/host/session/session_fixture.h"

namespace StandIn {
namespace {

using Tavon::Lib::TavonException;
using testing::AllOf;
using testing::Contains;
using testing::HasSubstr;
using testing::StartsWith;
using Kernel = EnterOptions::Kernel;

EnterOptions OnKernel(Kernel kernel) {
  EnterOptions options;
  options.kernel = kernel;
  return options;
}

bool KernelHas(const std::string& domain) {
  unsigned int id = 0;
  return SecPolicy::ZekAccessInterfaceImpl().FindDomain(domain, &id);
}

class EnteredHostTest : public SessionTest {
 protected:
  EnteredHostTest() { Assembled(); }

  // In a process of its own that has entered the host.
  void InEnteredHost(const EnterOptions& options,
                     const std::function<void(EnteredHost&)>& body) const {
    InChild([&] {
      EnteredHost host(Path(), options);
      body(host);
    });
  }

  void ExpectKept(const std::string& domain, bool isKept) const {
    InEnteredHost({}, [&](EnteredHost&) { EXPECT_EQ(KernelHas(domain), isKept) << domain; });
  }
};

TEST_F(EnteredHostTest, WhatIsDoneIsKept) {
  InEnteredHost({}, [](EnteredHost&) { EXPECT_EQ(SecPolicy::CreateDomain("netDom"), 1u); });
  ExpectKept("netDom", true);
}

TEST_F(EnteredHostTest, BatchIsKeptByItsCommitAndLostWithout) {
  InEnteredHost({}, [](EnteredHost& host) {
    host.BeginBatch();
    SecPolicy::CreateDomain("netDom");
    host.Commit();
    host.BeginBatch();
    SecPolicy::CreateDomain("lostDom");
  });
  ExpectKept("netDom", true);
  ExpectKept("lostDom", false);
}

TEST_F(EnteredHostTest, KernelOfItsOwnIsForgotten) {
  InEnteredHost({}, [](EnteredHost&) { SecPolicy::CreateDomain("netDom"); });
  InEnteredHost(OnKernel(Kernel::kSnapshot), [](EnteredHost&) {
    EXPECT_TRUE(KernelHas("netDom"));
    SecPolicy::CreateDomain("lostDom");
  });
  InEnteredHost(OnKernel(Kernel::kScratch), [](EnteredHost&) {
    EXPECT_FALSE(KernelHas("netDom"));
    SecPolicy::CreateDomain("lostDom");
  });
  ExpectKept("lostDom", false);
}

TEST_F(EnteredHostTest, OperationsAreTracedAndRefusedOnRequest) {
  std::vector<std::string> lines;
  EnterOptions options;
  options.trace = [&](const std::string& line) { lines.push_back(line); };
  options.faults = {"create-domain:2"};
  InEnteredHost(options, [&](EnteredHost&) {
    SecPolicy::CreateDomain("netDom");
    EXPECT_THROW(SecPolicy::CreateDomain("webDom"), TavonException);
    EXPECT_THAT(lines, AllOf(Contains("create-domain netDom run-time"),
                             Contains(StartsWith("create-domain webDom run-time ! refused"))));
  });
  ExpectKept("webDom", false);
}

TEST_F(EnteredHostTest, DirectoryFromOutsideIsVisible) {
  WriteBytes(Visible() + "/file", "policy\n");
  EnterOptions options;
  options.visible = {Visible()};
  InEnteredHost(options,
                [&](EnteredHost&) { EXPECT_EQ(ReadBytes(Visible() + "/file"), "policy\n"); });
}

TEST_F(EnteredHostTest, NobodyAnswersBehindIt) {
  InChild([&] {
    { const EnteredHost host(Path()); }
    EXPECT_THAT(MessageOf<TavonException>([] { SecPolicy::GetDomainNameForID(0); }),
                HasSubstr("Function not implemented"));
    EXPECT_THAT(MessageOf<TavonException>([] { KernelHas("rootDom"); }), HasSubstr("no host"));
  });
}

TEST_F(EnteredHostTest, UnknownFaultIsSaidBeforeAnythingChanges) {
  InChild([&] {
    EnterOptions options;
    options.faults = {"no-such-operation"};
    EXPECT_THROW(EnteredHost(Path(), options), std::invalid_argument);
    EXPECT_TRUE(std::filesystem::exists(Path("host.json")));
  });
}

TEST_F(EnteredHostTest, WhatIsNoHostIsRefused) {
  InChild([&] {
    EXPECT_THAT(MessageOf<HostError>([&] { const EnteredHost host(Path("tardisks")); }),
                StartsWith(Path("tardisks") + " is not a host directory"));
  });
}

}  // namespace
}  // namespace StandIn
