#include "domain/keyword_rules.h"

#include "platform/tavon_strcat.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;
using Tavon::Misc::StrCat;

unsigned int IdOfDomain(const std::string& name, ZekAccessInterfaceImpl& iface) {
  unsigned int id = 0;
  if (!iface.FindDomain(name, &id)) throw TavonException("Failed to fetch domain id for: " + name);
  return id;
}

void CapabilityParamRules::CheckConstraints(std::string domainName,
                                            ZekAccessInterfaceImpl& iface) try {
  iface.CheckCapabilityParamRuleConstraints(domainName, Rules());
} catch (const TavonException& failure) {
  throw TavonException(
      StrCat("Policy constraint error for domain: ", domainName, " : ", failure.what()));
}

}  // namespace SecPolicy
