// The tardisk stage of a load, and the tardisk section of the display.
#include "core/diagnostics.h"
#include "platform/tavon_strcat.h"
#include "tardisk/tardisk_discovery.h"
#include "tardisk/tardisk_policy.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;
using Tavon::Misc::StrCat;
using ZekCtl::Security::ZekAccess_DomTransRule;

namespace {

// Owns the policies that discovery finds, also while discovery throws half-way.
struct OwnedPolicies {
  OwnedPolicies() = default;
  OwnedPolicies(const OwnedPolicies&) = delete;
  OwnedPolicies& operator=(const OwnedPolicies&) = delete;
  ~OwnedPolicies() {
    for (const TardiskPolicy* policy : list) delete policy;
  }

  std::list<TardiskPolicy*> list;
};

ZekAccess_DomTransRule DefaultTransition(ZekAccessInterfaceImpl& iface) {
  ZekAccess_DomTransRule rule;
  rule.label = iface.GetDefaultTardiskLabel();
  // The name is the platform's, the id that of the domain which the load looked up: the two are
  // used side by side.
  rule.targetDomain = iface.GetDefaultTardiskDomain();
  rule.targetDomainId = GetDefaultTardiskDomain();
  rule.domainName = iface.GetTardiskLaunchDomain();
  rule.transition = iface.GetTardiskExecEventKeyword();
  rule.grant = true;
  if (!iface.FindDomain(rule.domainName, &rule.domainId)) {
    throw TavonException("Failed to fetch domain id for " + rule.domainName);
  }
  return rule;
}

// Runs `step`; logs `what` and then the reason, each on a line of its own, when it fails.
template <typename Step>
bool SucceedsOrLogsBoth(const char* what, Step step) {
  try {
    step();
    return true;
  } catch (const TavonException& failure) {
    SecpolicyError(what);
    SecpolicyError(failure.what());
    return false;
  }
}

// Installs the policies of the tardisks that have one, and sorts out those that have none.
bool SetSpecifiedPolicies(const std::string& dir, std::list<std::string>& withoutPolicy,
                          ZekAccessInterfaceImpl& iface) {
  OwnedPolicies withPolicy;
  GetTardiskLists(dir, withPolicy.list, withoutPolicy);
  return SucceedsOrLogs([&] { ParseAndSetTardiskPolicy(withPolicy.list, iface); });
}

}  // namespace

void SetDefaultTardiskPolicy(std::list<std::string>& tardisks, ZekAccessInterfaceImpl& iface) {
  const ZekAccess_DomTransRule rule = DefaultTransition(iface);
  bool allSet = SucceedsOrLogsBoth("Failed to set default tardisk rule: ",
                                   [&] { iface.SetDomTransRule(rule); });
  for (const std::string& tardisk : tardisks) {
    allSet &= SucceedsOrLogsBoth("Failed to set default tardisk label: ",
                                 [&] { SetFileLabel(tardisk, rule.label, iface); });
  }
  if (!allSet) throw TavonException("Failure in setting default tardisk policy");
}

void LoadPolicyTardisks(std::string dir, ZekAccessInterfaceImpl& iface) {
  std::list<std::string> withoutPolicy;
  const bool specifiedSet = SetSpecifiedPolicies(dir, withoutPolicy, iface);
  const bool defaultSet = SucceedsOrLogs([&] { SetDefaultTardiskPolicy(withoutPolicy, iface); });
  if (!specifiedSet || !defaultSet) throw TavonException("Failure in setting tardisk policy");
}

void DisplayPolicyTardiskLabels(ZekAccessInterfaceImpl& iface) {
  DisplayHeader("Tardisk Path (label)", "");
  std::list<std::string> tardisks;
  GetAllTardisks(tardisks);
  for (const std::string& tardisk : tardisks) {
    try {
      PrintLine(StrCat(tardisk, " (", GetFileLabel(tardisk, iface), ")"));
    } catch (const TavonException& failure) {
      SecpolicyError(StrCat("Error in reading tardisk label: (", tardisk, "): ", failure.what()));
    }
  }
}

}  // namespace SecPolicy
