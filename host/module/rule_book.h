// The rules of all domains that end in a decision.
#pragma once

#include <array>
#include <cstdint>
#include <unordered_map>
#include <vector>

#include "host/module/rule.h"
#include "host/module/rule_table.h"

namespace StandIn {

// Judges nothing: domains and words are the caller's to check.
class RuleBook {
 public:
  // As RuleTable::Set.
  void Set(RuleType type, DomainId domain, const Rule& rule);
  [[nodiscard]] bool Holds(RuleType type, DomainId domain, const FewWords& words) const;
  [[nodiscard]] std::vector<Rule> Rules(RuleType type, DomainId domain) const;
  // As RuleTable::ForEach.
  template <typename Visit>
  void ForEach(RuleType type, DomainId domain, Visit visit) const {
    if (const RuleTable* const table = TableOf(type, domain)) table->ForEach(visit);
  }

  // How many rules of all domains name the domain: the transitions into it.
  [[nodiscard]] std::uint32_t TransitionsInto(DomainId domain) const;
  // Drops the domain's rules and every domain's transitions into it. Throws nothing.
  void ForgetDomain(DomainId domain);

 private:
  using DomainRules = std::array<RuleTable, ZekCtl::Security::kRuleTypes.size()>;

  [[nodiscard]] const RuleTable* TableOf(RuleType type, DomainId domain) const;

  std::unordered_map<DomainId, DomainRules> domains_;
  std::unordered_map<DomainId, std::uint32_t> transitionsInto_;
};

}  // namespace StandIn
