// The entry points and the order of the stages.
#include "core/diagnostics.h"
#include "core/well_known_domains.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;

namespace {

constexpr char kSystemPolicyDir[] = "/etc/olvane/secpolicy";

// The id of a domain without which the host must not go on.
unsigned int RequireDomain(const char* name, const char* failure, ZekAccessInterfaceImpl& iface) {
  unsigned int id = 0;
  if (!iface.FindDomain(name, &id)) {
    SecpolicyError(failure);
    // There is no exception to raise again unless the caller is handling one: this ends the
    // process, on purpose, before a later stage can install policy for a domain that is not there.
    throw;
  }
  return id;
}

void RequireWellKnownDomains(ZekAccessInterfaceImpl& iface) {
  WellKnownDomains& known = KnownDomains();
  known.globalVM =
      RequireDomain("globalVMDom", "Failed to fetch domainID for global VM Domain", iface);
  iface.SetGlobalVMDomain(known.globalVM);
  known.ioFilter =
      RequireDomain("ioFilterDom", "Failed to fetch domainID for IOFilter domain", iface);
  iface.SetIoFilterDomain(known.ioFilter);
  known.defaultTardisk =
      RequireDomain("appDom", "Failed to fetch domainID for default tar disk domain", iface);
}

}  // namespace

void LoadPolicy(std::string dir) {
  ZekAccessInterfaceImpl iface;
  SecpolicyInfo("Using policy dir " + dir);
  bool allSet = true;
  const auto run = [&](auto stage, const std::string& stageDir) {
    allSet &= SucceedsOrLogs([&] { stage(stageDir, iface); });
  };
  run(LoadPolicyObjects, dir + "/objects");
  run(LoadPolicyDomains, dir + "/domains");
  RequireWellKnownDomains(iface);
  // Tardisk policy comes from the system's own directory, whatever the caller named: it is part of
  // the images that the host runs from.
  run(LoadPolicyTardisks, std::string(kSystemPolicyDir) + "/tardisks");
  run(LoadPolicyFileLabels, dir + "/fileLabels");
  if (!allSet) {
    throw TavonException("There were some problems encountered in setting the policy");
  }
  SecpolicyInfo("System security policy has been set successfully");
}

void DisplayPolicy(std::string selector) {
  ZekAccessInterfaceImpl iface;
  DisplayPolicyDomains(iface, selector);
  DisplayPolicyObjects(iface);
  DisplayPolicyTardiskLabels(iface);
}

unsigned int GetGlobalVMDomain() { return KnownDomains().globalVM; }

unsigned int GetIOFilterDomain() { return KnownDomains().ioFilter; }

unsigned int GetDefaultTardiskDomain() { return KnownDomains().defaultTardisk; }

}  // namespace SecPolicy
