// One tardisk policy file.
#pragma once

#include <list>
#include <map>
#include <memory>
#include <string>

#include "tardisk/tardisk_rules.h"

namespace SecPolicy {

// A policy file that lies in a tardisk and says how that tardisk differs from the default tardisk
// policy. Failures are TavonExceptions.
class TardiskPolicy {
 public:
  // Keeps the path; neither opens nor reads the file.
  explicit TardiskPolicy(std::string path);

  [[nodiscard]] const std::string& PolicyFile() const noexcept { return policyFile_; }

  // Asks the platform which tardisk carries the policy file: "/tardisks/" + its name, or an empty
  // string when none does. Throws "Unable to open policy file " + path, "Unable to get attributes
  // for policy file " + path, or the system-information service's exception.
  std::string GetBackingTardiskPath();

  // Reads the policy file into the rule sets; one that no tardisk carries is logged and not read.
  // Throws what GetBackingTardiskPath and ParseFile throw; at the first bad line
  // ThrowDomainParseError's text, with the policy file in the domain's place and "invalid tardisk
  // policy rule type (" + type + ")" or the rule set's reason. The rules before it stay.
  void ParsePolicy(ZekAccessInterfaceImpl& iface);

  // Installs every rule set; the first exception passes through.
  void SetPolicy(ZekAccessInterfaceImpl& iface);

 private:
  std::string policyFile_;
  std::map<std::string, std::unique_ptr<TardiskRules>> rules_;
};

// Logs that the policy file lies in no tardisk.
void LogNoBackingTardisk(const std::string& policyFile);

// Parses every policy, then installs every policy, those that failed to parse with the rules that
// they had gathered. Failures are logged. Throws "Failure in setting specified tardisk policy" if
// any failed. The policies stay the caller's.
void ParseAndSetTardiskPolicy(std::list<TardiskPolicy*> policies, ZekAccessInterfaceImpl& iface);

}  // namespace SecPolicy
