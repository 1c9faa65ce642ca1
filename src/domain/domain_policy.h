// One security domain's policy.
#pragma once

#include <map>
#include <memory>
#include <string>

#include "domain/policy_rules.h"

namespace SecPolicy {

// A domain with a rule set for each of the eight rule types. Every walk over the rule sets follows
// the byte order of their keywords: -a, -c, -d, -f, -p, -r, -s, -u. Failures are TavonExceptions.
class DomainPolicy {
 public:
  DomainPolicy(std::string domainName, unsigned int domainId);

  void SetPolicyFile(std::string path);
  // Keeps this domain's rules out of the kernel.
  void MarkErroneous() noexcept { hasErrors_ = true; }

  // Reads the policy file into the rule sets. Throws "Policy file path has not been set for domain
  // " + name; ParseFile's text; at the first bad line ThrowDomainParseError's text, with "invalid
  // policy rule type (" + type + ")" or the rule set's reason. The rules of the lines before stay.
  void ParsePolicy(ZekAccessInterfaceImpl& iface);

  // Checks every rule set; the first exception passes through.
  void CheckPolicyConstraints(ZekAccessInterfaceImpl& iface);

  // Hands every rule set to the kernel; the first exception passes through and the later rule sets
  // are not set. Throws "Skipping the policy for domain " + name + " due to errors in the policy",
  // nothing set, for a domain that was marked.
  void SetPolicy(ZekAccessInterfaceImpl& iface);

  // Adds the rules that the kernel holds. A rule type that cannot be read is logged and left out.
  void ReadSystemPolicy(ZekAccessInterfaceImpl& iface);

  // Prints every rule, then an empty line.
  void PrintPolicy();

 private:
  unsigned int domainId_;
  std::string domainName_;
  std::string policyFile_;
  bool hasErrors_ = false;
  std::map<std::string, std::unique_ptr<PolicyRules>> rules_;
};

}  // namespace SecPolicy
