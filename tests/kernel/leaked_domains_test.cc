// The list of domains without owners.
#include <algorithm>
#include <array>

#include "tests/support/host_test.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;

constexpr unsigned int kUntouched = 4711;

class LeakedDomainsTest : public HostTest {
 protected:
  // In a process that ends at once.
  void CreateAndEnd(const std::vector<std::string>& names) {
    Run([&] {
      for (const std::string& name : names) SecPolicy::CreateDomain(name);
    });
  }

  // The count, then the cells of an array of four, of which `capacity` are offered.
  static std::string Retrieve(unsigned long capacity) {
    std::array<unsigned int, 4> ids{kUntouched, kUntouched, kUntouched, kUntouched};
    unsigned int count = kUntouched;
    SecPolicy::RetrieveLeakedDomains(capacity, ids.data(), &count);
    std::string text = std::to_string(count) + ":";
    for (const unsigned int id : ids) text += " " + std::to_string(id);
    return text;
  }
};

TEST_F(LeakedDomainsTest, DomainsWhoseMakerHasEndedAreListed) {
  CreateAndEnd({"aDom", "bDom"});
  const Outcome outcome = Run([] { return Retrieve(4); });
  EXPECT_EQ(outcome.value, "2: 1 2 4711 4711");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: leaked-domains"));
}

TEST_F(LeakedDomainsTest, DomainsOfTheCallerAndOfThePolicyAreNot) {
  WellKnownDomains();
  EXPECT_EQ(Load().error, "");
  const Outcome outcome = Run([] {
    SecPolicy::CreateDomain("ownDom");
    return Retrieve(4);
  });
  EXPECT_EQ(outcome.value, "0: 4711 4711 4711 4711");
}

TEST_F(LeakedDomainsTest, ADestroyedDomainLeaksNoLonger) {
  CreateAndEnd({"aDom", "bDom"});
  Run([] { SecPolicy::DestroyDomain(1); });
  EXPECT_EQ(Run([] { return Retrieve(4); }).value, "1: 2 4711 4711 4711");
}

TEST_F(LeakedDomainsTest, ATooSmallArrayIsFilledAndTheCountSaysAll) {
  CreateAndEnd({"aDom", "bDom", "cDom"});
  EXPECT_EQ(Run([] { return Retrieve(2); }).value, "3: 1 2 4711 4711");
  EXPECT_EQ(Run([] { return Retrieve(3); }).value, "3: 1 2 3 4711");
}

TEST_F(LeakedDomainsTest, WithoutAnArrayTheCountAloneIsAsked) {
  CreateAndEnd({"aDom", "bDom"});
  const Outcome outcome = Run([] {
    unsigned int count = kUntouched;
    SecPolicy::RetrieveLeakedDomains(0, nullptr, &count);
    return count;
  });
  EXPECT_EQ(outcome.value, "2");
}

TEST_F(LeakedDomainsTest, AnArrayThatCannotBeWrittenIsAFailure) {
  CreateAndEnd({"aDom"});
  const Outcome outcome = Run([] {
    unsigned int count = 0;
    SecPolicy::RetrieveLeakedDomains(1, nullptr, &count);
  });
  EXPECT_EQ(outcome.error, "Failed to retrieve leaked domain list:Bad address");
}

}  // namespace
}  // namespace SecPolicyTest
