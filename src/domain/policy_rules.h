// The rule set: the rules of one type in one domain.
#pragma once

#include <queue>
#include <string>
#include <utility>

#include "secpolicy/secpolicy.h"

namespace SecPolicy {

// Keeps the rules of one type in the order of their policy file. Failures are TavonExceptions.
class PolicyRules {
 public:
  // Parses the words of one policy line (those behind the rule type) into a rule and appends it.
  // Throws ThrowDomainParseError's text with the line's failure; the rule set is then unchanged.
  virtual void AddRule(unsigned int line, std::string domainName, unsigned int domainId,
                       std::queue<std::string> args, ZekAccessInterfaceImpl& iface) = 0;

  // Hands every rule to the kernel. Throws ThrowDomainSetError's text at the first refusal: the
  // rules before it stay in the kernel, the later ones are not sent.
  virtual void Set(ZekAccessInterfaceImpl& iface) = 0;

  // Appends the rules that the kernel holds for the domain.
  virtual void ReadSystemRules(unsigned int domainId, ZekAccessInterfaceImpl& iface) = 0;

  // Checks the rules as a whole, before anything is set.
  virtual void CheckConstraints(std::string domainName, ZekAccessInterfaceImpl& iface) = 0;

  // Prints each rule to standard output, in the form of a policy line.
  virtual void PrintRules() = 0;

  virtual ~PolicyRules() = default;

  // The rule type's keyword in policy files, for example "-s".
  [[nodiscard]] const std::string& Keyword() const noexcept { return keyword_; }
  void SetKeyword(std::string keyword) { keyword_ = std::move(keyword); }

 private:
  std::string keyword_;
};

}  // namespace SecPolicy
