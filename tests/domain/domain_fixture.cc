#include "tests/domain/domain_fixture.h"

#include <fcntl.h>

#include <sstream>

#include "host/attached_host.h"
#include "host/files/unique_fd.h"

namespace SecPolicyTest {

std::queue<std::string> WordsOf(const std::string& line) {
  return SecPolicy::ParsePolicyLine(line);
}

unsigned int DomainCalled(const std::string& name) {
  StandIn::SecurityModule& module = StandIn::Attached()->unobserved;
  const auto found = module.FindDomain(name);
  return found ? *found : module.CreateDomain(name, StandIn::DomainOrigin::kPolicy);
}

int LowestFreeDescriptor() { return StandIn::UniqueFd(open("/", O_RDONLY | O_CLOEXEC)).Get(); }

Outcome DomainTest::LoadDomains() {
  return RunWithInterface([&](SecPolicy::ZekAccessInterfaceImpl& iface) {
    SecPolicy::LoadPolicyDomains(PolicyPath("domains"), iface);
  });
}

std::vector<std::string> DomainTest::RulesOf(const std::string& domain) {
  FailNothing();
  const Outcome outcome = RunWithInterface([&](SecPolicy::ZekAccessInterfaceImpl& iface) {
    unsigned int id = 0;
    if (!iface.FindDomain(domain, &id)) throw Tavon::Lib::TavonException("no such domain");
    SecPolicy::DisplayDomainPolicy(iface, id);
  });
  if (!outcome.error.empty()) return {"(" + outcome.error + ")"};
  std::vector<std::string> rules;
  std::istringstream lines(outcome.out);
  for (std::string line; std::getline(lines, line);) {
    // The banner's lines of dashes begin with two.
    if (line.starts_with("-") && !line.starts_with("--")) rules.push_back(line);
  }
  return rules;
}

}  // namespace SecPolicyTest
