// The direct calls on domains and worlds.
#include <unistd.h>

#include "host/attached_host.h"
#include "tests/support/host_test.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;

class DomainCallsTest : public HostTest {
 protected:
  // Domains made at run time, with the ids 1, 2...
  void Domains(const std::vector<std::string>& names) {
    Run([&] {
      for (const std::string& name : names) SecPolicy::CreateDomain(name);
    });
  }

  std::string NameOf(unsigned int domain) {
    const Outcome outcome = Run([&] { return SecPolicy::GetDomainNameForID(domain); });
    return outcome.error.empty() ? outcome.value : outcome.error;
  }
};

// ---- CreateDomain -----------------------------------------------------------------------------

TEST_F(DomainCallsTest, ADomainIsCreatedAtRunTimeAndItsIdReturned) {
  const Outcome outcome = Run([] { return SecPolicy::CreateDomain("guestDom"); });
  EXPECT_EQ(outcome.value, "1");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: open-interface", "kernel: create-domain guestDom run-time",
                          "kernel: close-interface"));
  EXPECT_EQ(NameOf(1), "guestDom");
}

TEST_F(DomainCallsTest, ADomainWithoutANameIsNotAskedFor) {
  const Outcome outcome = Run([] { return SecPolicy::CreateDomain(""); });
  EXPECT_EQ(outcome.error, "Must specify domain name");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: open-interface", "kernel: close-interface"));
}

TEST_F(DomainCallsTest, AnExistingDomainIsNotCreatedAgain) {
  Domains({"guestDom"});
  const Outcome outcome = Run([] { return SecPolicy::CreateDomain("guestDom"); });
  EXPECT_EQ(outcome.error, "Failed to create domain:guestDom :File exists");
  EXPECT_EQ(outcome.events.back(), "kernel: close-interface");
}

TEST_F(DomainCallsTest, ADomainsNameHasAtMost127Characters) {
  const std::string longest(127, 'n');
  Domains({longest});
  EXPECT_EQ(NameOf(1), longest);
  const std::string tooLong(128, 'n');
  EXPECT_EQ(Run([&] { return SecPolicy::CreateDomain(tooLong); }).error,
            "Failed to create domain:" + tooLong + " :File name too long");
}

// ---- DestroyDomain ----------------------------------------------------------------------------

TEST_F(DomainCallsTest, ADestroyedDomainIsGone) {
  Domains({"guestDom", "otherDom"});
  const Outcome outcome = Run([] { SecPolicy::DestroyDomain(1); });
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: open-interface", "kernel: destroy-domain guestDom",
                          "kernel: close-interface"));
  EXPECT_EQ(NameOf(1), "Unable to get domain name: No such file or directory");
  EXPECT_EQ(NameOf(2), "otherDom");
}

TEST_F(DomainCallsTest, ADomainThatTheKernelKeepsStays) {
  EXPECT_EQ(Run([] { SecPolicy::DestroyDomain(0); }).error,
            "Failed to destroy domain:Device or resource busy");
  EXPECT_EQ(NameOf(0), "rootDom");
  EXPECT_EQ(Run([] { SecPolicy::DestroyDomain(4294967295u); }).error,
            "Failed to destroy domain:No such file or directory");
}

// ---- AddUlvoService ---------------------------------------------------------------------------

TEST_F(DomainCallsTest, AServiceIsAddedThroughTheInterface) {
  Domains({"guestDom"});
  const Outcome outcome = Run([] { SecPolicy::AddUlvoService(1, "clip board"); });
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: open-interface", "kernel: add-service guestDom clip board",
                          "kernel: close-interface"));
}

TEST_F(DomainCallsTest, AServiceWithoutANameIsNotAskedFor) {
  const Outcome outcome = Run([] { SecPolicy::AddUlvoService(0, ""); });
  EXPECT_EQ(outcome.error, "Must specify service string");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: open-interface", "kernel: close-interface"));
}

TEST_F(DomainCallsTest, TheInterfacesRefusalOfAServicePassesUnchanged) {
  EXPECT_EQ(Run([] { SecPolicy::AddUlvoService(9, "clipboard"); }).error, "no domain has the id 9");
}

TEST_F(DomainCallsTest, NothingIsAskedWithoutAnInterface) {
  Fail(Operation::kOpenInterface);
  struct Row {
    const char* name;
    void (*call)();
  };
  const Row rows[] = {{"CreateDomain", [] { SecPolicy::CreateDomain("guestDom"); }},
                      {"CreateDomain, no name", [] { SecPolicy::CreateDomain(""); }},
                      {"DestroyDomain", [] { SecPolicy::DestroyDomain(0); }},
                      {"AddUlvoService", [] { SecPolicy::AddUlvoService(0, "clipboard"); }},
                      {"AddUlvoService, no name", [] { SecPolicy::AddUlvoService(0, ""); }}};
  for (const Row& row : rows) {
    const Outcome outcome = Run(row.call);
    EXPECT_EQ(outcome.error, "refused on request: open-interface, call 1") << row.name;
    EXPECT_EQ(outcome.events.size(), 1u) << row.name;
  }
}

// ---- Worlds and names -------------------------------------------------------------------------

TEST_F(DomainCallsTest, AWorldsDomainIsAskedWithoutAnInterface) {
  Domains({"guestDom"});
  const Outcome outcome = Run([] {
    StandIn::Attached()->unobserved.PlaceWorld(4711, 1);
    return SecPolicy::GetDomainIDForWorld(4711);
  });
  EXPECT_EQ(outcome.value, "1");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: world-domain 4711"));
}

TEST_F(DomainCallsTest, TheCallersOwnWorldIsInTheRootDomain) {
  EXPECT_EQ(Run([] { return SecPolicy::GetDomainIDForWorld(getpid()); }).value, "0");
}

TEST_F(DomainCallsTest, AnUnknownWorldHasNoDomain) {
  for (const int world : {999999, 0, -1, -2147483647 - 1}) {
    const Outcome outcome = Run([&] { return SecPolicy::GetDomainIDForWorld(world); });
    EXPECT_EQ(outcome.error, "Unable to get domain ID: No such process");
    EXPECT_THAT(outcome.Operations(),
                ElementsAre("world-domain " + std::to_string(world) + " ! no world has the id " +
                            std::to_string(world)));
  }
}

TEST_F(DomainCallsTest, ADomainsNameIsAskedWithoutAnInterface) {
  const Outcome outcome = Run([] { return SecPolicy::GetDomainNameForID(0); });
  EXPECT_EQ(outcome.value, "rootDom");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: domain-name 0"));
}

}  // namespace
}  // namespace SecPolicyTest
