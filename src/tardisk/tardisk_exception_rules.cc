#include "tardisk/tardisk_exception_rules.h"

#include "core/diagnostics.h"
#include "platform/tavon_strcat.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;
using Tavon::Misc::StrCat;
using ZekCtl::Security::ZekAccess_DomTransRule;

namespace {

void SetTransition(const ZekAccess_TardiskExceptionRule& rule, ZekAccessInterfaceImpl& iface) {
  ZekAccess_DomTransRule transition;
  transition.line = rule.line;
  // The launch domain is named, its id left 0, unlike in the default rule.
  transition.domainName = iface.GetTardiskLaunchDomain();
  transition.label = rule.label;
  transition.targetDomain = rule.targetDomain;
  transition.targetDomainId = rule.targetDomainId;
  transition.transition = iface.GetTardiskExecEventKeyword();
  transition.grant = true;
  // Hosts expect the rule twice.
  iface.SetDomTransRule(transition);
  iface.SetDomTransRule(transition);
}

// Runs `step` for each rule; a failure is named after the rule that it befell.
template <typename Step>
void ForEachRule(const std::list<ZekAccess_TardiskExceptionRule>& rules, Step step) {
  for (const ZekAccess_TardiskExceptionRule& rule : rules) {
    try {
      step(rule);
    } catch (const TavonException& failure) {
      throw TavonException(AtLine(rule.policyFile, rule.line,
                                  StrCat("Tardisk: ", rule.tardisk, " : ", failure.what())));
    }
  }
}

}  // namespace

void TardiskExceptionRules::AddRule(unsigned int line, std::string tardisk, std::string policyFile,
                                    std::queue<std::string> args,
                                    ZekAccessInterfaceImpl& iface) try {
  if (!rules_.empty()) throw TavonException("Only one rule of this type is allowed");
  if (args.size() != 2) RuleSizeError();
  ZekAccess_TardiskExceptionRule rule{line, tardisk, args.front(), args.back(), 0, policyFile};
  if (!iface.FindDomain(rule.targetDomain, &rule.targetDomainId)) {
    throw TavonException("Failed to fetch domain id for " + rule.targetDomain);
  }
  rules_.push_back(std::move(rule));
} catch (const TavonException& failure) {
  ThrowDomainParseError(line, policyFile, failure.what());
}

void TardiskExceptionRules::Set(ZekAccessInterfaceImpl& iface) {
  using Rule = ZekAccess_TardiskExceptionRule;
  ForEachRule(rules_, [&](const Rule& rule) { SetFileLabel(rule.tardisk, rule.label, iface); });
  ForEachRule(rules_, [&](const Rule& rule) { SetTransition(rule, iface); });
}

}  // namespace SecPolicy
