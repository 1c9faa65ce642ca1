// The domain stage of a load.
#include <list>
#include <string>

#include "core/diagnostics.h"
#include "domain/domain_policy.h"
#include "kernel/domain_calls.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;
using ZekCtl::Kernel::DomainOrigin;

namespace {

unsigned int FindOrCreateDomain(const std::string& name, ZekAccessInterfaceImpl& iface) {
  unsigned int id = 0;
  if (!iface.FindDomain(name, &id) && !CreateKernelDomain(name, DomainOrigin::kPolicy, &id)) {
    throw TavonException("Failed to create domain: " + name);
  }
  return id;
}

// Every domain exists before any is parsed, so that transition rules may name any of them.
std::list<DomainPolicy> MakeDomains(const std::string& dir, ZekAccessInterfaceImpl& iface) {
  std::map<std::string, std::string> files;
  GetFileList(dir, files);
  std::list<DomainPolicy> domains;
  for (const auto& [path, name] : files) {
    const unsigned int id = FindOrCreateDomain(name, iface);
    domains.emplace_back(name, id).SetPolicyFile(path);
  }
  SecpolicyInfo("Parsed all domain names");
  return domains;
}

// A domain that fails to parse is not marked: the rules before its bad line are checked and set.
bool ParseDomains(std::list<DomainPolicy>& domains, ZekAccessInterfaceImpl& iface) {
  bool allParsed = true;
  for (DomainPolicy& domain : domains) {
    allParsed &= SucceedsOrLogs([&] { domain.ParsePolicy(iface); });
  }
  LogSummary(allParsed, "Domain policies parsed and syntax validated",
             "Error in parsing the policy for some domains");
  return allParsed;
}

// A domain whose rules contradict each other is marked, and fails when it is to be set.
void CheckDomains(std::list<DomainPolicy>& domains, ZekAccessInterfaceImpl& iface) {
  bool allChecked = true;
  for (DomainPolicy& domain : domains) {
    if (SucceedsOrLogs([&] { domain.CheckPolicyConstraints(iface); })) continue;
    domain.MarkErroneous();
    allChecked = false;
  }
  LogSummary(allChecked, "Constraints check for domain policies succeeded",
             "Error in policy constraints check for some domains");
}

bool SetDomains(std::list<DomainPolicy>& domains, ZekAccessInterfaceImpl& iface) {
  bool allSet = true;
  for (DomainPolicy& domain : domains) {
    allSet &= SucceedsOrLogs([&] { domain.SetPolicy(iface); });
  }
  LogSummary(allSet, "Domain policies set", "Error in setting the policy for some domains");
  return allSet;
}

}  // namespace

void LoadPolicyDomains(std::string dir, ZekAccessInterfaceImpl& iface) {
  std::list<DomainPolicy> domains = MakeDomains(dir, iface);
  const bool allParsed = ParseDomains(domains, iface);
  CheckDomains(domains, iface);
  const bool allSet = SetDomains(domains, iface);
  if (!allParsed || !allSet) throw TavonException("Failure in domain policy");
}

}  // namespace SecPolicy
