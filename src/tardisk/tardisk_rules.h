// The rule set of a tardisk policy file.
#pragma once

#include <queue>
#include <string>
#include <utility>

#include "secpolicy/secpolicy.h"

namespace SecPolicy {

// Keeps the rules of one type of a tardisk policy file. Failures are TavonExceptions.
class TardiskRules {
 public:
  // Parses the words of one policy line (those behind the rule type) and keeps the rule. `tardisk`
  // is the path of the tardisk that carries `policyFile`. Throws ThrowDomainParseError's text, with
  // the policy file in the domain's place; the rule set is then unchanged.
  virtual void AddRule(unsigned int line, std::string tardisk, std::string policyFile,
                       std::queue<std::string> args, ZekAccessInterfaceImpl& iface) = 0;

  // Installs the rules. The first failure ends it; what was installed before it stays.
  virtual void Set(ZekAccessInterfaceImpl& iface) = 0;

  virtual ~TardiskRules() = default;

  // The rule type's keyword in policy files.
  [[nodiscard]] const std::string& Keyword() const noexcept { return keyword_; }
  void SetKeyword(std::string keyword) { keyword_ = std::move(keyword); }

 private:
  std::string keyword_;
};

}  // namespace SecPolicy
