// What a display makes of domains and rules that cannot be read.
#include <iostream>
#include <streambuf>

#include "host/attached_host.h"
#include "host/module/simulated_module.h"
#include "tests/domain/domain_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

class DomainDisplayFailureTest : public DomainTest {
 protected:
  DomainDisplayFailureTest() {
    Describe(R"({"format": 1, "limits": {"domains": 5}})");
    Domain("aDom", "-a default read grant\n-s openat grant\n-r /bin x\n-u default dgram grant\n");
    Domain("bDom", "-s close grant\n");
  }

  Outcome DisplayDomains(const std::string& selector) {
    return RunWithInterface([&](SecPolicy::ZekAccessInterfaceImpl& iface) {
      SecPolicy::DisplayPolicyDomains(iface, selector);
    });
  }
};

TEST_F(DomainDisplayFailureTest, ATypeThatCannotBeReadIsLoggedAndLeftOut) {
  LoadDomains();
  Fail(Operation::kGetRules, 1);
  Fail(Operation::kGetRules, 6);
  const Outcome outcome = DisplayDomains("1");
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Errors(), ElementsAre("refused on request: get-rules, call 1",
                                            "refused on request: get-rules, call 6"));
  EXPECT_EQ(outcome.err,
            "Error: refused on request: get-rules, call 1\n"
            "Error: refused on request: get-rules, call 6\n");
  EXPECT_THAT(outcome.out, testing::EndsWith("--\n-r /bin x\n-u default dgram grant\n\n"));
}

TEST_F(DomainDisplayFailureTest, FileRulesThatCannotBeReadAreLeftOut) {
  LoadDomains();
  Fail(Operation::kReadFileRules);
  const Outcome outcome = DisplayDomains("1");
  EXPECT_THAT(outcome.Errors(), ElementsAre("refused on request: read-file-rules, call 1"));
  EXPECT_THAT(outcome.out, testing::EndsWith("--\n-a default read grant\n-s openat grant\n"
                                             "-u default dgram grant\n\n"));
}

TEST_F(DomainDisplayFailureTest, AFailingLookupOfAllDomainsIsReportedAtTheEnd) {
  LoadDomains();
  Fail(Operation::kDomainInfo, 2);
  const Outcome outcome = DisplayDomains("");
  EXPECT_EQ(outcome.error, "Error in displaying the policy for some domains");
  EXPECT_THAT(outcome.Errors(), IsEmpty());
  EXPECT_EQ(outcome.err, "");
  EXPECT_EQ(outcome.Operations({"domain-info"}).size(), 5u);
  EXPECT_THAT(outcome.out, Not(HasSubstr("aDom")));
  EXPECT_THAT(outcome.out, testing::EndsWith("--\n-s close grant\n\n"));
}

TEST_F(DomainDisplayFailureTest, RulesThatCannotBeReadDoNotFailTheDisplayOfAllDomains) {
  LoadDomains();
  for (std::uint64_t call = 1; call <= 21; ++call) Fail(Operation::kGetRules, call);
  const Outcome outcome = DisplayDomains("");
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.Errors().size(), 21u);
}

TEST_F(DomainDisplayFailureTest, AFailingLookupOfOneDomainReachesTheCaller) {
  Fail(Operation::kDomainInfo);
  const Outcome outcome = DisplayDomains("0");
  EXPECT_EQ(outcome.error, "refused on request: domain-info, call 1");
  EXPECT_THAT(outcome.Errors(), IsEmpty());
}

TEST_F(DomainDisplayFailureTest, AnUnknownNumberOfDomainsReachesTheCaller) {
  Fail(Operation::kMaxDomains);
  const Outcome outcome = DisplayDomains("");
  EXPECT_EQ(outcome.error, "refused on request: max-domains, call 1");
  EXPECT_THAT(outcome.Operations({"domain-info"}), IsEmpty());
}

class NoProcesses final : public StandIn::ProcessTable {
 public:
  StandIn::ProcessIdentity Self() const override { return {}; }
  bool Runs(const StandIn::ProcessIdentity&) const override { return false; }
};

TEST_F(DomainDisplayFailureTest, WithoutSlotsTheTitleStandsAlone) {
  const Outcome outcome = Run([] {
    StandIn::ModuleDescription description;
    description.limits.domains = 0;
    const NoProcesses processes;
    StandIn::SimulatedModule module(description, processes);
    const StandIn::AttachedHost host{module, StandIn::Attached()->point, module,
                                     StandIn::Attached()->files};
    StandIn::Attach(&host);
    SecPolicy::ZekAccessInterfaceImpl iface;
    SecPolicy::DisplayPolicyDomains(iface, "");
  });
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.out,
            "\n\n------------------------\nPolicy set in the kernel\n\n"
            "------------------------\n");
}

// Fails at a text, as an exporter behind standard output might.
class FailingOutput final : public std::streambuf {
 public:
  explicit FailingOutput(std::string at) : at_(std::move(at)) {}

 protected:
  std::streamsize xsputn(const char* text, std::streamsize size) override {
    if (std::string(text, static_cast<std::size_t>(size)).starts_with(at_)) {
      throw Tavon::Lib::TavonException("cannot print");
    }
    return size;
  }
  int_type overflow(int_type character) override { return character; }

 private:
  std::string at_;
};

TEST_F(DomainDisplayFailureTest, AFailureInPrintingRulesIsLoggedWithTheDomainsName) {
  LoadDomains();
  const Outcome outcome = RunWithInterface([](SecPolicy::ZekAccessInterfaceImpl& iface) {
    FailingOutput output("-s openat");
    std::cerr.tie(nullptr);  // would flush the failed stream
    std::streambuf* const before = std::cout.rdbuf(&output);
    std::cout.exceptions(std::ios::badbit);
    SecPolicy::DisplayDomainPolicy(iface, 1);
    std::cout.exceptions(std::ios::goodbit);
    std::cout.rdbuf(before);
  });
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Errors(), ElementsAre("Failed to get policy for domain :aDomcannot print"));
}

}  // namespace
}  // namespace SecPolicyTest
