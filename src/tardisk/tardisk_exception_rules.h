// The rule type "-E": a tardisk that is an exception from the default tardisk policy.
#pragma once

#include <cstdint>
#include <list>
#include <string>

#include "tardisk/tardisk_rules.h"

namespace SecPolicy {

struct ZekAccess_TardiskExceptionRule {
  std::uint32_t line = 0;
  std::string tardisk;       // path of the tardisk's file
  std::string label;         // the label that the tardisk's file gets
  std::string targetDomain;  // the domain into which its programs are started, and its kernel id
  std::uint32_t targetDomainId = 0;
  std::string policyFile;
};

// At most one rule a policy file: a label for the tardisk and a domain for its programs.
class TardiskExceptionRules : public virtual TardiskRules {
 public:
  // Reasons of a parse error: "Only one rule of this type is allowed", RuleSizeError's text,
  // "Failed to fetch domain id for " + domain.
  void AddRule(unsigned int line, std::string tardisk, std::string policyFile,
               std::queue<std::string> args, ZekAccessInterfaceImpl& iface) override;

  // Labels the tardisk, then sets the transition. Throws policy file + ":" + line + " : Tardisk: "
  // + tardisk + " : " and the reason, SetFileLabel's or the kernel-access library's.
  void Set(ZekAccessInterfaceImpl& iface) override;

 private:
  std::list<ZekAccess_TardiskExceptionRule> rules_;
};

}  // namespace SecPolicy
