#include "domain/domain_policy.h"

#include <tuple>
#include <type_traits>
#include <utility>

#include "core/diagnostics.h"
#include "core/rule_lines.h"
#include "domain/file_path_access_rules.h"
#include "domain/keyword_rules.h"
#include "platform/rule_types.h"

namespace SecPolicy {

using namespace ZekCtl::Security;
using Tavon::Lib::TavonException;

namespace {

// The class of a record's rule set. One that adds nothing to its family may do without a line here.
template <typename Record>
struct RuleSetOf : std::type_identity<KeywordRules<Record>> {};
template <>
struct RuleSetOf<ZekAccess_SyscallRule> : std::type_identity<SyscallRules> {};
template <>
struct RuleSetOf<ZekAccess_CapabilityRule> : std::type_identity<CapabilityRules> {};
template <>
struct RuleSetOf<ZekAccess_CapabilityParamRule> : std::type_identity<CapabilityParamRules> {};
template <>
struct RuleSetOf<ZekAccess_ObjectAccessRule> : std::type_identity<ObjectAccessRules> {};
template <>
struct RuleSetOf<ZekAccess_DomTransRule> : std::type_identity<DomTransRules> {};
template <>
struct RuleSetOf<ZekAccess_FileCreationRule> : std::type_identity<FileCreationRules> {};
template <>
struct RuleSetOf<ZekAccess_UnixSockCreationRule> : std::type_identity<UnixSockCreationRules> {};
template <>
struct RuleSetOf<ZekAccess_FilePathAccessRule> : std::type_identity<FilePathAccessRules> {};

using RuleSets = std::map<std::string, std::unique_ptr<PolicyRules>>;

template <typename Record>
void AddRuleSet(const RuleRow<Record>& row, RuleSets& ruleSets) {
  auto& ruleSet = ruleSets[row.info.keyword] = std::make_unique<typename RuleSetOf<Record>::type>();
  ruleSet->SetKeyword(row.info.keyword);
}

}  // namespace

DomainPolicy::DomainPolicy(std::string domainName, unsigned int domainId)
    : domainId_(domainId), domainName_(std::move(domainName)) {
  std::apply([&](const auto&... rows) { (AddRuleSet(rows, rules_), ...); }, kRuleRows);
}

void DomainPolicy::SetPolicyFile(std::string path) { policyFile_ = std::move(path); }

void DomainPolicy::ParsePolicy(ZekAccessInterfaceImpl& iface) {
  if (policyFile_.empty()) {
    throw TavonException("Policy file path has not been set for domain " + domainName_);
  }
  ForEachRuleLine(policyFile_, domainName_, "invalid policy rule type (", rules_,
                  [&](PolicyRules& ruleSet, unsigned int line, std::queue<std::string>& args) {
                    ruleSet.AddRule(line, domainName_, domainId_, std::move(args), iface);
                  });
}

void DomainPolicy::CheckPolicyConstraints(ZekAccessInterfaceImpl& iface) {
  for (const auto& [keyword, ruleSet] : rules_) ruleSet->CheckConstraints(domainName_, iface);
}

void DomainPolicy::SetPolicy(ZekAccessInterfaceImpl& iface) {
  if (hasErrors_) {
    throw TavonException("Skipping the policy for domain " + domainName_ +
                         " due to errors in the policy");
  }
  for (const auto& [keyword, ruleSet] : rules_) ruleSet->Set(iface);
}

void DomainPolicy::ReadSystemPolicy(ZekAccessInterfaceImpl& iface) {
  for (const auto& entry : rules_) {
    // A rule type that cannot be read is logged and does not hide the others.
    (void)SucceedsOrLogs([&] { entry.second->ReadSystemRules(domainId_, iface); });
  }
}

void DomainPolicy::PrintPolicy() {
  for (const auto& [keyword, ruleSet] : rules_) ruleSet->PrintRules();
  PrintLine("");
}

}  // namespace SecPolicy
