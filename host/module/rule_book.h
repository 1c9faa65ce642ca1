// The rules of all domains, file rules aside.
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
  void Set(RuleKind kind, DomainId domain, const Rule& rule);
  [[nodiscard]] bool Holds(RuleKind kind, DomainId domain, const FewWords& words) const;
  [[nodiscard]] std::vector<Rule> Rules(RuleKind kind, DomainId domain) const;
  // As RuleTable::ForEach.
  template <typename Visit>
  void ForEach(RuleKind kind, DomainId domain, Visit visit) const {
    if (const RuleTable* const table = TableOf(kind, domain)) table->ForEach(visit);
  }

  // How many transitions, of all domains, lead into the domain.
  [[nodiscard]] std::uint32_t TransitionsInto(DomainId domain) const;
  // Drops the domain's rules and every domain's transitions into it. Throws nothing.
  void ForgetDomain(DomainId domain);

 private:
  using DomainRules = std::array<RuleTable, kRuleKinds>;

  [[nodiscard]] const RuleTable* TableOf(RuleKind kind, DomainId domain) const;

  std::unordered_map<DomainId, DomainRules> domains_;
  std::unordered_map<DomainId, std::uint32_t> transitionsInto_;
};

}  // namespace StandIn
