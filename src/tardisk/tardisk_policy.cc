#include "tardisk/tardisk_policy.h"

#include <utility>

#include "core/diagnostics.h"
#include "core/rule_lines.h"
#include "tardisk/backing_tardisk.h"
#include "tardisk/tardisk_exception_rules.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;

namespace {

constexpr char kExceptionKeyword[] = "-E";

}  // namespace

TardiskPolicy::TardiskPolicy(std::string path) : policyFile_(std::move(path)) {
  auto& ruleSet = rules_[kExceptionKeyword] = std::make_unique<TardiskExceptionRules>();
  ruleSet->SetKeyword(kExceptionKeyword);
}

std::string TardiskPolicy::GetBackingTardiskPath() { return BackingTardiskPath(policyFile_); }

void TardiskPolicy::ParsePolicy(ZekAccessInterfaceImpl& iface) {
  const std::string tardisk = GetBackingTardiskPath();
  if (tardisk.empty()) {
    LogNoBackingTardisk(policyFile_);
    return;
  }
  ForEachRuleLine(policyFile_, policyFile_, "invalid tardisk policy rule type (", rules_,
                  [&](TardiskRules& ruleSet, unsigned int line, std::queue<std::string>& args) {
                    ruleSet.AddRule(line, tardisk, policyFile_, std::move(args), iface);
                  });
}

void TardiskPolicy::SetPolicy(ZekAccessInterfaceImpl& iface) {
  for (const auto& [keyword, ruleSet] : rules_) ruleSet->Set(iface);
}

void LogNoBackingTardisk(const std::string& policyFile) {
  SecpolicyError("No backing tardisk for policy file " + policyFile);
}

void ParseAndSetTardiskPolicy(std::list<TardiskPolicy*> policies, ZekAccessInterfaceImpl& iface) {
  bool allParsed = true;
  for (TardiskPolicy* policy : policies) {
    allParsed &= SucceedsOrLogs([&] { policy->ParsePolicy(iface); });
  }
  LogSummary(allParsed, "Parsed all the tardisk policy files",
             "Error in parsing some tardisk policy files");
  bool allSet = true;
  for (TardiskPolicy* policy : policies) {
    allSet &= SucceedsOrLogs([&] { policy->SetPolicy(iface); });
  }
  LogSummary(allSet, "Set all the tardisk labels and policy",
             "Error in setting some tardisk labels and policy");
  if (!allParsed || !allSet) {
    throw TavonException("Failure in setting specified tardisk policy");
  }
}

}  // namespace SecPolicy
