// Keeping the kernel's labels in step with the policy's.
#include <string_view>
#include <unordered_set>

#include "core/diagnostics.h"

namespace SecPolicy {

using ZekCtl::Security::kDomainLabel;

namespace {

const char* KindOf(ZekAccessLabelType type) { return type == kDomainLabel ? "domains" : "objects"; }

void LogLabels(const std::string& heading, const std::vector<std::string>& labels) {
  if (labels.empty()) return;
  SecpolicyInfo(heading);
  for (const std::string& label : labels) SecpolicyInfo(label);
}

}  // namespace

void SyncLabelsFromPolicy(std::vector<std::string> policyLabels,
                          std::map<std::string, long> existing, ZekAccessLabelType type,
                          ZekAccessInterfaceImpl& iface) {
  // An invalid label gets a fresh value by being dropped and defined anew.
  const std::vector<std::string> invalid = iface.GetInvalidLabels(type);
  iface.RemoveLabels(invalid, type);
  iface.AddLabels(invalid, type);
  PrintInvalidLabels(invalid, type);

  const std::vector<std::string> obsolete = GetObsoleteLabels(policyLabels, existing, type, iface);
  iface.RemoveLabels(obsolete, type);
  PrintObsoleteLabels(obsolete, type);

  iface.AddLabels(policyLabels, type);
}

std::vector<std::string> GetObsoleteLabels(std::vector<std::string> policyLabels,
                                           std::map<std::string, long> existing,
                                           ZekAccessLabelType type, ZekAccessInterfaceImpl& iface) {
  const std::unordered_set<std::string_view> wanted(policyLabels.begin(), policyLabels.end());
  std::vector<std::string> obsolete;
  for (const auto& [name, id] : existing) {
    if (type == kDomainLabel && iface.IsPrivilegedVm(name)) continue;
    if (wanted.contains(name)) continue;
    if (iface.IsPredefinedLabel(name, type)) continue;
    obsolete.push_back(name);
  }
  return obsolete;
}

void PrintObsoleteLabels(std::vector<std::string> labels, ZekAccessLabelType type) {
  LogLabels(std::string("The following ") + KindOf(type) + " have been removed:", labels);
}

void PrintInvalidLabels(std::vector<std::string> labels, ZekAccessLabelType type) {
  LogLabels(std::string("The values of the following ") + KindOf(type) + " have been changed:",
            labels);
}

}  // namespace SecPolicy
