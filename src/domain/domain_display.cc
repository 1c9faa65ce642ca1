// Printing of the domains that the kernel holds.
#include <cstdlib>

#include "core/diagnostics.h"
#include "domain/domain_policy.h"
#include "platform/tavon_strcat.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;
using Tavon::Misc::StrCat;

namespace {

void DisplayAllDomains(ZekAccessInterfaceImpl& iface) {
  const unsigned int slots = iface.GetMaxDomains();
  bool allDisplayed = true;
  for (unsigned int id = 0; id < slots; ++id) {
    try {
      DisplayDomainPolicy(iface, id);
    } catch (const TavonException&) {
      allDisplayed = false;
    }
  }
  if (!allDisplayed) throw TavonException("Error in displaying the policy for some domains");
}

void DisplayRules(ZekAccessInterfaceImpl& iface, const std::string& name, unsigned int id) try {
  DomainPolicy policy(name, id);
  policy.ReadSystemPolicy(iface);
  policy.PrintPolicy();
} catch (const TavonException& failure) {
  SecpolicyError(StrCat("Failed to get policy for domain :", name, failure.what()));
}

}  // namespace

void DisplayPolicyDomains(ZekAccessInterfaceImpl& iface, std::string domain) {
  DisplayHeader("Policy set in the kernel", "");
  if (domain.empty()) {
    DisplayAllDomains(iface);
  } else {
    // Text that is not a number is domain 0, as callers are used to.
    const long id = std::strtol(domain.c_str(), nullptr, 10);
    DisplayDomainPolicy(iface, static_cast<unsigned int>(id));
  }
}

void DisplayDomainPolicy(ZekAccessInterfaceImpl& iface, unsigned int domainId) {
  std::string name;
  std::string enforcementLevel;
  unsigned int state = 0;
  unsigned int refCount = 0;
  unsigned int worldRefCount = 0;
  if (!iface.GetCompleteDomainInfo(domainId, name, enforcementLevel, state, refCount,
                                   worldRefCount)) {
    return;
  }
  DisplayHeader(
      StrCat("Domain Name: ", name, " Domain ID :", domainId,
             " Enforcement Level: ", enforcementLevel),
      StrCat("State: ", state, " RefCount: ", refCount, " WorldRefCount: ", worldRefCount));
  DisplayRules(iface, name, domainId);
}

}  // namespace SecPolicy
