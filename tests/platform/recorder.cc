// A platform of its own: it writes each operation that it is asked for to standard error, and knows
// four domains, a list of words for each kind, and two labels.
#include <cstring>
#include <iostream>
#include <string>

#include "platform/sysinfo.h"
#include "platform/tavon_exception.h"
#include "platform/tavon_strcat.h"
#include "platform/zek_access.h"

namespace {

using Tavon::Misc::StrCat;

const std::map<std::string, unsigned int> kDomains{
    {"rootDom", 0}, {"appDom", 1}, {"globalVMDom", 2}, {"ioFilterDom", 3}};
const std::map<std::string, unsigned int> kLabels{{"default", 1}, {"old", 2}};

// In one piece, like the library's own lines.
template <typename... Parts>
void Record(const char* operation, const Parts&... parts) {
  std::string line = StrCat("platform: ", operation);
  ((line += StrCat(" ", parts)), ...);
  std::cerr << line + "\n" << std::flush;
}

void RecordLabels(const char* operation, const std::vector<std::string>& labels) {
  std::string names;
  for (const std::string& label : labels) names += (names.empty() ? "" : " ") + label;
  Record(operation, names);
}

const char* Decision(bool isGranted) { return isGranted ? "grant" : "revoke"; }

}  // namespace

namespace ZekCtl::Security {

struct ZekAccessInterfaceImpl::State {};

ZekAccessInterfaceImpl::ZekAccessInterfaceImpl() : state_(std::make_unique<State>()) {
  Record("open");
}

ZekAccessInterfaceImpl::~ZekAccessInterfaceImpl() { Record("close"); }

bool ZekAccessInterfaceImpl::FindDomain(std::string name, unsigned int* id) {
  Record("FindDomain", name);
  const auto found = kDomains.find(name);
  if (found == kDomains.end()) return false;
  *id = found->second;
  return true;
}

void ZekAccessInterfaceImpl::SetGlobalVMDomain(unsigned int id) { Record("SetGlobalVMDomain", id); }

void ZekAccessInterfaceImpl::SetIoFilterDomain(unsigned int id) { Record("SetIoFilterDomain", id); }

unsigned int ZekAccessInterfaceImpl::GetMaxDomains() {
  Record("GetMaxDomains");
  return 2;
}

bool ZekAccessInterfaceImpl::GetCompleteDomainInfo(unsigned int id, std::string& name,
                                                   std::string& enforcementLevel,
                                                   unsigned int& state, unsigned int& refCount,
                                                   unsigned int& worldRefCount) {
  Record("GetCompleteDomainInfo", id);
  if (id != 1) return false;
  name = "appDom";
  enforcementLevel = "enforcing";
  state = refCount = worldRefCount = 1;
  return true;
}

void ZekAccessInterfaceImpl::AddUlvoService(unsigned int domainId, const std::string& service) {
  Record("AddUlvoService", domainId, service);
}

void ZekAccessInterfaceImpl::ValidateKeyword(ZekAccess_KeywordType type, std::string word) {
  Record("ValidateKeyword", static_cast<unsigned int>(type), word);
  if (word == "unheard") throw Tavon::Lib::TavonException("the platform does not know " + word);
}

std::map<std::string, long> ZekAccessInterfaceImpl::GetKeywordsMap(ZekAccess_KeywordType type) {
  Record("GetKeywordsMap", static_cast<unsigned int>(type));
  return {kLabels.begin(), kLabels.end()};
}

void ZekAccessInterfaceImpl::SetSyscallRule(ZekAccess_SyscallRule rule) {
  Record("SetSyscallRule", rule.line, rule.domainId, rule.domainName, rule.syscall,
         Decision(rule.grant));
}

void ZekAccessInterfaceImpl::SetCapabilityRule(ZekAccess_CapabilityRule rule) {
  Record("SetCapabilityRule", rule.line, rule.domainId, rule.domainName, rule.capability,
         Decision(rule.grant));
}

void ZekAccessInterfaceImpl::SetCapabilityParamRule(ZekAccess_CapabilityParamRule rule) {
  Record("SetCapabilityParamRule", rule.line, rule.domainId, rule.domainName, rule.capability,
         rule.parameter, Decision(rule.grant));
}

void ZekAccessInterfaceImpl::SetObjectAccessRule(ZekAccess_ObjectAccessRule rule) {
  Record("SetObjectAccessRule", rule.line, rule.domainId, rule.domainName, rule.object, rule.access,
         Decision(rule.grant));
}

void ZekAccessInterfaceImpl::SetDomTransRule(ZekAccess_DomTransRule rule) {
  Record("SetDomTransRule", rule.line, rule.domainId, rule.domainName, rule.label,
         rule.targetDomain, rule.targetDomainId, rule.transition, Decision(rule.grant));
}

void ZekAccessInterfaceImpl::SetFileCreationRule(ZekAccess_FileCreationRule rule) {
  Record("SetFileCreationRule", rule.line, rule.domainId, rule.domainName, rule.parentLabel,
         rule.fileLabel, rule.fileType, Decision(rule.grant));
}

void ZekAccessInterfaceImpl::SetUnixSockCreationRule(ZekAccess_UnixSockCreationRule rule) {
  Record("SetUnixSockCreationRule", rule.line, rule.domainId, rule.domainName, rule.label,
         rule.sockType, Decision(rule.grant));
}

void ZekAccessInterfaceImpl::CheckCapabilityParamRuleConstraints(
    std::string domainName, std::list<ZekAccess_CapabilityParamRule> rules) {
  Record("CheckCapabilityParamRuleConstraints", domainName, rules.size());
}

void ZekAccessInterfaceImpl::GetSyscallRules(unsigned int domainId,
                                             std::list<ZekAccess_SyscallRule>& rules) {
  Record("GetSyscallRules", domainId);
  rules.push_back({0, domainId, "appDom", "openat", true});
}

void ZekAccessInterfaceImpl::GetFilePathAccessRules(unsigned int domainId,
                                                    std::list<ZekAccess_FilePathAccessRule>&) {
  Record("GetFilePathAccessRules", domainId);
}

void ZekAccessInterfaceImpl::GetCapabilityRules(unsigned int domainId,
                                                std::list<ZekAccess_CapabilityRule>&) {
  Record("GetCapabilityRules", domainId);
  throw Tavon::Lib::TavonException("the platform keeps no capabilities");
}

void ZekAccessInterfaceImpl::GetCapabilityParamRules(unsigned int domainId,
                                                     std::list<ZekAccess_CapabilityParamRule>&) {
  Record("GetCapabilityParamRules", domainId);
}

void ZekAccessInterfaceImpl::GetObjectAccessRules(unsigned int domainId,
                                                  std::list<ZekAccess_ObjectAccessRule>&) {
  Record("GetObjectAccessRules", domainId);
}

void ZekAccessInterfaceImpl::GetDomTransRules(unsigned int domainId,
                                              std::list<ZekAccess_DomTransRule>&) {
  Record("GetDomTransRules", domainId);
}

void ZekAccessInterfaceImpl::GetFileCreationRules(unsigned int domainId,
                                                  std::list<ZekAccess_FileCreationRule>&) {
  Record("GetFileCreationRules", domainId);
}

void ZekAccessInterfaceImpl::GetUnixSockCreationRules(unsigned int domainId,
                                                      std::list<ZekAccess_UnixSockCreationRule>&) {
  Record("GetUnixSockCreationRules", domainId);
}

std::vector<std::string> ZekAccessInterfaceImpl::GetInvalidLabels(ZekAccessLabelType type) {
  Record("GetInvalidLabels", static_cast<unsigned int>(type));
  return {"stale"};
}

void ZekAccessInterfaceImpl::AddLabels(std::vector<std::string> labels, ZekAccessLabelType) {
  RecordLabels("AddLabels", labels);
}

void ZekAccessInterfaceImpl::RemoveLabels(std::vector<std::string> labels, ZekAccessLabelType) {
  RecordLabels("RemoveLabels", labels);
}

bool ZekAccessInterfaceImpl::IsPredefinedLabel(std::string label, ZekAccessLabelType) {
  Record("IsPredefinedLabel", label);
  return label == "default";
}

bool ZekAccessInterfaceImpl::IsPrivilegedVm(const std::string& name) {
  Record("IsPrivilegedVm", name);
  return false;
}

unsigned int ZekAccessInterfaceImpl::LookupLabel(std::string label, ZekAccessLabelType) {
  Record("LookupLabel", label);
  return 7;
}

std::string ZekAccessInterfaceImpl::GetLabel(unsigned int id, ZekAccessLabelType) {
  Record("GetLabel", id);
  return "default";
}

std::string ZekAccessInterfaceImpl::GetTardiskLaunchDomain() {
  Record("GetTardiskLaunchDomain");
  return "rootDom";
}

std::string ZekAccessInterfaceImpl::GetTardiskExecEventKeyword() {
  Record("GetTardiskExecEventKeyword");
  return "exec";
}

std::string ZekAccessInterfaceImpl::GetDefaultTardiskLabel() {
  Record("GetDefaultTardiskLabel");
  return "tardisk";
}

std::string ZekAccessInterfaceImpl::GetDefaultTardiskDomain() {
  Record("GetDefaultTardiskDomain");
  return "appDom";
}

}  // namespace ZekCtl::Security

namespace ZekCtl::Util {

struct Sysinfo::State {};

Sysinfo::Sysinfo(unsigned int node) { Record("Sysinfo", node); }

Sysinfo::~Sysinfo() = default;

void Sysinfo::AddInstancePath(const unsigned long&) { Record("AddInstancePath"); }

// The tardisk whose policy the asking file is.
void Sysinfo::Get(void* buffer, unsigned int size) {
  Record("Get", size);
  InodeStats stats{};
  std::string("vendor.tar").copy(stats.tardiskName, sizeof stats.tardiskName - 1);
  std::memcpy(buffer, &stats, sizeof stats);
}

}  // namespace ZekCtl::Util
