#include "host/module/rule_book.h"

namespace StandIn {

namespace {

constexpr std::size_t kTransitions = static_cast<std::size_t>(RuleKind::kTransition);

}  // namespace

const RuleTable* RuleBook::TableOf(RuleKind kind, DomainId domain) const {
  const auto found = domains_.find(domain);
  return found == domains_.end() ? nullptr : &found->second[static_cast<std::size_t>(kind)];
}

void RuleBook::Set(RuleKind kind, DomainId domain, const Rule& rule) {
  RuleTable& table = domains_[domain][static_cast<std::size_t>(kind)];
  if (kind != RuleKind::kTransition) {
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

bool RuleBook::Holds(RuleKind kind, DomainId domain, const FewWords& words) const {
  const RuleTable* const table = TableOf(kind, domain);
  return table != nullptr && table->Holds(words);
}

std::vector<Rule> RuleBook::Rules(RuleKind kind, DomainId domain) const {
  const RuleTable* const table = TableOf(kind, domain);
  return table == nullptr ? std::vector<Rule>() : table->Rules();
}

std::uint32_t RuleBook::TransitionsInto(DomainId domain) const {
  const auto found = transitionsInto_.find(domain);
  return found == transitionsInto_.end() ? 0 : found->second;
}

void RuleBook::ForgetDomain(DomainId domain) {
  if (const RuleTable* const transitions = TableOf(RuleKind::kTransition, domain)) {
    transitions->ForEachTarget([this](DomainId target) { --transitionsInto_[target]; });
  }
  domains_.erase(domain);
  if (TransitionsInto(domain) == 0) {
    return;
  }
  for (auto& [other, tables] : domains_) {
    tables[kTransitions].DropTarget(domain);
  }
  transitionsInto_.erase(domain);
}

}  // namespace StandIn
