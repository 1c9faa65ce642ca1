// The kernel-access library, thin over the attached host's security module.
#include "platform/zek_access.h"

#include <utility>

#include "host/access/host_in_use.h"
#include "host/access/rule_records.h"
#include "host/module/permission_letters.h"

namespace ZekCtl::Security {

using namespace StandIn;

namespace {

std::string NameOf(const AttachedHost& host, unsigned int domainId) {
  return host.unobserved.DomainName(domainId);
}

template <typename Record>
void SetRule(SecurityModule& module, Record record) {
  const DomainId domain = record.domainId;
  AsPlatform(
      [&] { module.SetRule(kRuleRow<Record>.info.type, domain, ToRule(std::move(record))); });
}

template <typename Record>
void GetRules(const AttachedHost& host, unsigned int domainId, std::list<Record>& records) {
  AsPlatform([&] {
    std::vector<Rule> rules = host.module.Rules(kRuleRow<Record>.info.type, domainId);
    const std::string name = NameOf(host, domainId);
    for (Rule& rule : rules) records.push_back(ToRecord<Record>(std::move(rule), domainId, name));
  });
}

}  // namespace

struct ZekAccessInterfaceImpl::State {
  const AttachedHost& host = HostInUse();
  SecurityModule& module = host.module;
};

ZekAccessInterfaceImpl::ZekAccessInterfaceImpl() : state_(std::make_unique<State>()) {
  AsPlatform([&] { state_->host.point.Pass(Operation::kOpenInterface, kNoWords, [] {}); });
}

ZekAccessInterfaceImpl::~ZekAccessInterfaceImpl() {
  try {
    state_->host.point.Pass(Operation::kCloseInterface, kNoWords, [] {});
  } catch (...) {
    // Closing cannot be refused.
  }
}

bool ZekAccessInterfaceImpl::FindDomain(std::string name, unsigned int* id) {
  const auto found = AsPlatform([&] { return state_->module.FindDomain(name); });
  if (found) *id = *found;
  return found.has_value();
}

void ZekAccessInterfaceImpl::SetGlobalVMDomain(unsigned int id) {
  AsPlatform([&] { state_->module.SetDomainRole(DomainRole::kGlobalVM, id); });
}

void ZekAccessInterfaceImpl::SetIoFilterDomain(unsigned int id) {
  AsPlatform([&] { state_->module.SetDomainRole(DomainRole::kIoFilter, id); });
}

unsigned int ZekAccessInterfaceImpl::GetMaxDomains() {
  return AsPlatform([&] { return state_->module.MaxDomains(); });
}

bool ZekAccessInterfaceImpl::GetCompleteDomainInfo(unsigned int id, std::string& name,
                                                   std::string& enforcementLevel,
                                                   unsigned int& state, unsigned int& refCount,
                                                   unsigned int& worldRefCount) {
  auto info = AsPlatform([&] { return state_->module.GetDomainInfo(id); });
  if (!info) return false;
  name = std::move(info->name);
  enforcementLevel = std::move(info->enforcementLevel);
  state = info->state;
  refCount = info->refCount;
  worldRefCount = info->worldRefCount;
  return true;
}

void ZekAccessInterfaceImpl::AddUlvoService(unsigned int domainId, const std::string& service) {
  AsPlatform([&] { state_->module.AddService(domainId, service); });
}

void ZekAccessInterfaceImpl::ValidateKeyword(ZekAccess_KeywordType type, std::string word) {
  AsPlatform([&] { state_->module.ValidateWord(ToModule(type), word); });
}

std::map<std::string, long> ZekAccessInterfaceImpl::GetKeywordsMap(ZekAccess_KeywordType type) {
  return AsPlatform([&] { return state_->module.Words(ToModule(type)); });
}

void ZekAccessInterfaceImpl::SetSyscallRule(ZekAccess_SyscallRule rule) {
  SetRule(state_->module, std::move(rule));
}

void ZekAccessInterfaceImpl::SetCapabilityRule(ZekAccess_CapabilityRule rule) {
  SetRule(state_->module, std::move(rule));
}

void ZekAccessInterfaceImpl::SetCapabilityParamRule(ZekAccess_CapabilityParamRule rule) {
  SetRule(state_->module, std::move(rule));
}

void ZekAccessInterfaceImpl::SetObjectAccessRule(ZekAccess_ObjectAccessRule rule) {
  SetRule(state_->module, std::move(rule));
}

void ZekAccessInterfaceImpl::SetDomTransRule(ZekAccess_DomTransRule rule) {
  SetRule(state_->module, std::move(rule));
}

void ZekAccessInterfaceImpl::SetFileCreationRule(ZekAccess_FileCreationRule rule) {
  SetRule(state_->module, std::move(rule));
}

void ZekAccessInterfaceImpl::SetUnixSockCreationRule(ZekAccess_UnixSockCreationRule rule) {
  SetRule(state_->module, std::move(rule));
}

void ZekAccessInterfaceImpl::CheckCapabilityParamRuleConstraints(
    std::string domainName, std::list<ZekAccess_CapabilityParamRule> rules) {
  AsPlatform([&] {
    std::vector<Rule> list;
    list.reserve(rules.size());
    for (ZekAccess_CapabilityParamRule& rule : rules) list.push_back(ToRule(std::move(rule)));
    state_->module.CheckCapabilityParams(domainName, list);
  });
}

void ZekAccessInterfaceImpl::GetSyscallRules(unsigned int domainId,
                                             std::list<ZekAccess_SyscallRule>& rules) {
  GetRules(state_->host, domainId, rules);
}

void ZekAccessInterfaceImpl::GetFilePathAccessRules(
    unsigned int domainId, std::list<ZekAccess_FilePathAccessRule>& rules) {
  AsPlatform([&] {
    const std::vector<FileRule> held = state_->module.FileRules(domainId);
    const std::string name = NameOf(state_->host, domainId);
    for (const FileRule& rule : held) {
      rules.push_back({0, domainId, name, rule.path, PermissionLetters(rule.permission)});
    }
  });
}

void ZekAccessInterfaceImpl::GetCapabilityRules(unsigned int domainId,
                                                std::list<ZekAccess_CapabilityRule>& rules) {
  GetRules(state_->host, domainId, rules);
}

void ZekAccessInterfaceImpl::GetCapabilityParamRules(
    unsigned int domainId, std::list<ZekAccess_CapabilityParamRule>& rules) {
  GetRules(state_->host, domainId, rules);
}

void ZekAccessInterfaceImpl::GetObjectAccessRules(unsigned int domainId,
                                                  std::list<ZekAccess_ObjectAccessRule>& rules) {
  GetRules(state_->host, domainId, rules);
}

void ZekAccessInterfaceImpl::GetDomTransRules(unsigned int domainId,
                                              std::list<ZekAccess_DomTransRule>& rules) {
  GetRules(state_->host, domainId, rules);
}

void ZekAccessInterfaceImpl::GetFileCreationRules(unsigned int domainId,
                                                  std::list<ZekAccess_FileCreationRule>& rules) {
  GetRules(state_->host, domainId, rules);
}

void ZekAccessInterfaceImpl::GetUnixSockCreationRules(
    unsigned int domainId, std::list<ZekAccess_UnixSockCreationRule>& rules) {
  GetRules(state_->host, domainId, rules);
}

std::vector<std::string> ZekAccessInterfaceImpl::GetInvalidLabels(ZekAccessLabelType type) {
  return AsPlatform([&] { return state_->module.InvalidLabels(ToModule(type)); });
}

void ZekAccessInterfaceImpl::AddLabels(std::vector<std::string> labels, ZekAccessLabelType type) {
  AsPlatform([&] { state_->module.AddLabels(labels, ToModule(type)); });
}

void ZekAccessInterfaceImpl::RemoveLabels(std::vector<std::string> labels,
                                          ZekAccessLabelType type) {
  AsPlatform([&] { state_->module.RemoveLabels(labels, ToModule(type)); });
}

bool ZekAccessInterfaceImpl::IsPredefinedLabel(std::string label, ZekAccessLabelType type) {
  return AsPlatform([&] { return state_->module.IsPredefinedLabel(label, ToModule(type)); });
}

bool ZekAccessInterfaceImpl::IsPrivilegedVm(const std::string& name) {
  return AsPlatform([&] { return state_->module.IsPrivilegedVm(name); });
}

unsigned int ZekAccessInterfaceImpl::LookupLabel(std::string label, ZekAccessLabelType type) {
  return AsPlatform([&] { return state_->module.LookupLabel(label, ToModule(type)); });
}

std::string ZekAccessInterfaceImpl::GetLabel(unsigned int id, ZekAccessLabelType type) {
  return AsPlatform([&] { return state_->module.LabelName(id, ToModule(type)); });
}

std::string ZekAccessInterfaceImpl::GetTardiskLaunchDomain() {
  return AsPlatform([&] { return state_->module.Tardisk(TardiskWord::kLaunchDomain); });
}

std::string ZekAccessInterfaceImpl::GetTardiskExecEventKeyword() {
  return AsPlatform([&] { return state_->module.Tardisk(TardiskWord::kExecEvent); });
}

std::string ZekAccessInterfaceImpl::GetDefaultTardiskLabel() {
  return AsPlatform([&] { return state_->module.Tardisk(TardiskWord::kDefaultLabel); });
}

std::string ZekAccessInterfaceImpl::GetDefaultTardiskDomain() {
  return AsPlatform([&] { return state_->module.Tardisk(TardiskWord::kDefaultDomain); });
}

}  // namespace ZekCtl::Security
