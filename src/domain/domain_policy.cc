#include "domain/domain_policy.h"

#include <array>
#include <utility>

#include "core/diagnostics.h"
#include "core/rule_lines.h"
#include "domain/file_path_access_rules.h"
#include "domain/keyword_rules.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;

namespace {

template <typename Rules>
std::unique_ptr<PolicyRules> Make() {
  return std::make_unique<Rules>();
}

struct RuleSetType {
  const char* keyword;
  std::unique_ptr<PolicyRules> (*make)();
};

constexpr std::array<RuleSetType, 8> kRuleSetTypes{{
    {"-s", Make<SyscallRules>},
    {"-c", Make<CapabilityRules>},
    {"-p", Make<CapabilityParamRules>},
    {"-a", Make<ObjectAccessRules>},
    {"-d", Make<DomTransRules>},
    {"-f", Make<FileCreationRules>},
    {"-u", Make<UnixSockCreationRules>},
    {"-r", Make<FilePathAccessRules>},
}};

}  // namespace

DomainPolicy::DomainPolicy(std::string domainName, unsigned int domainId)
    : domainId_(domainId), domainName_(std::move(domainName)) {
  for (const RuleSetType& type : kRuleSetTypes) {
    auto& ruleSet = rules_[type.keyword] = type.make();
    ruleSet->SetKeyword(type.keyword);
  }
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
