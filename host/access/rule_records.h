// The access library's rule records and the module's rules, each made from the other.
#pragma once

#include <string>
#include <utility>

#include "host/module/rule.h"
#include "platform/rule_types.h"

namespace StandIn {

template <typename Record>
Rule ToRule(Record record) {
  Rule rule;
  rule.line = record.line;
  rule.decision = record.grant ? Decision::kGrant : Decision::kRevoke;
  for (const auto& word : ZekCtl::Security::kRuleRow<Record>.Words()) {
    rule.words.push_back(std::move(record.*word.field));
    if (word.domainId != nullptr) rule.targetDomain = record.*word.domainId;
  }
  return rule;
}

template <typename Record>
Record ToRecord(Rule rule, DomainId domain, const std::string& domainName) {
  Record record;
  record.line = rule.line;
  record.domainId = domain;
  record.domainName = domainName;
  record.grant = rule.decision == Decision::kGrant;
  std::size_t i = 0;
  for (const auto& word : ZekCtl::Security::kRuleRow<Record>.Words()) {
    record.*word.field = std::move(rule.words[i++]);
    if (word.domainId != nullptr) record.*word.domainId = rule.targetDomain;
  }
  return record;
}

}  // namespace StandIn
