#include "host/module/rule_book.h"

namespace StandIn {

const RuleTable* RuleBook::TableOf(RuleType type, DomainId domain) const {
  const auto found = domains_.find(domain);
  return found == domains_.end() ? nullptr : &found->second[static_cast<std::size_t>(type)];
}

void RuleBook::Set(RuleType type, DomainId domain, const Rule& rule) {
  RuleTable& table = domains_[domain][static_cast<std::size_t>(type)];
  if (!InfoOf(type).DomainWord()) {
    table.Set(rule);
    return;
  }
  // Found first: once the rule is set, nothing may fail.
  std::uint32_t& into = transitionsInto_[rule.targetDomain];
  const auto replaced = table.Set(rule);
  ++into;
  if (replaced) {
    --transitionsInto_[*replaced];
  }
}

bool RuleBook::Holds(RuleType type, DomainId domain, const FewWords& words) const {
  const RuleTable* const table = TableOf(type, domain);
  return table != nullptr && table->Holds(words);
}

std::vector<Rule> RuleBook::Rules(RuleType type, DomainId domain) const {
  const RuleTable* const table = TableOf(type, domain);
  return table == nullptr ? std::vector<Rule>() : table->Rules();
}

std::uint32_t RuleBook::TransitionsInto(DomainId domain) const {
  const auto found = transitionsInto_.find(domain);
  return found == transitionsInto_.end() ? 0 : found->second;
}

void RuleBook::ForgetDomain(DomainId domain) {
  for (const auto& info : ZekCtl::Security::kRuleTypes) {
    const RuleTable* const rules = info.DomainWord() ? TableOf(info.type, domain) : nullptr;
    if (rules == nullptr) continue;
    rules->ForEachTarget([this](DomainId target) { --transitionsInto_[target]; });
  }
  domains_.erase(domain);
  if (TransitionsInto(domain) == 0) {
    return;
  }
  for (auto& [other, tables] : domains_) {
    for (const auto& info : ZekCtl::Security::kRuleTypes) {
      if (info.DomainWord()) tables[static_cast<std::size_t>(info.type)].DropTarget(domain);
    }
  }
  transitionsInto_.erase(domain);
}

}  // namespace StandIn
