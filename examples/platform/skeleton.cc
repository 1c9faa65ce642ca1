// What a platform's library starts from: both classes, with every operation refused. Fill them in
// one by one by docs/porting.md; conformance.cc tells how far it is.
//
//   c++ -std=c++20 -shared -fPIC -Wl,-soname,libplatform.so.1
//       -I SOURCES/src skeleton.cc -o libplatform.so.1
//   ln -s libplatform.so.1 libplatform.so
#include "platform/sysinfo.h"
#include "platform/tavon_exception.h"
#include "platform/tavon_strcat.h"
#include "platform/zek_access.h"

namespace {

[[noreturn]] void Refuse(const char* operation) {
  throw Tavon::Lib::TavonException(
      Tavon::Misc::StrCat("the platform does not supply ", operation, " yet"));
}

}  // namespace

namespace ZekCtl::Security {

// What a connection to the security module needs: a descriptor, for instance. Destroyed with it.
struct ZekAccessInterfaceImpl::State {};

ZekAccessInterfaceImpl::ZekAccessInterfaceImpl() : state_(std::make_unique<State>()) {}

ZekAccessInterfaceImpl::~ZekAccessInterfaceImpl() = default;

// ---- Domains -----------------------------------------------------------------------------------

bool ZekAccessInterfaceImpl::FindDomain(std::string, unsigned int*) { Refuse("FindDomain"); }

void ZekAccessInterfaceImpl::SetGlobalVMDomain(unsigned int) { Refuse("SetGlobalVMDomain"); }

void ZekAccessInterfaceImpl::SetIoFilterDomain(unsigned int) { Refuse("SetIoFilterDomain"); }

unsigned int ZekAccessInterfaceImpl::GetMaxDomains() { Refuse("GetMaxDomains"); }

bool ZekAccessInterfaceImpl::GetCompleteDomainInfo(unsigned int, std::string&, std::string&,
                                                   unsigned int&, unsigned int&, unsigned int&) {
  Refuse("GetCompleteDomainInfo");
}

void ZekAccessInterfaceImpl::AddUlvoService(unsigned int, const std::string&) {
  Refuse("AddUlvoService");
}

// ---- Words -------------------------------------------------------------------------------------

void ZekAccessInterfaceImpl::ValidateKeyword(ZekAccess_KeywordType, std::string) {
  Refuse("ValidateKeyword");
}

std::map<std::string, long> ZekAccessInterfaceImpl::GetKeywordsMap(ZekAccess_KeywordType) {
  Refuse("GetKeywordsMap");
}

// ---- Rules -------------------------------------------------------------------------------------

void ZekAccessInterfaceImpl::SetSyscallRule(ZekAccess_SyscallRule) { Refuse("SetSyscallRule"); }

void ZekAccessInterfaceImpl::SetCapabilityRule(ZekAccess_CapabilityRule) {
  Refuse("SetCapabilityRule");
}

void ZekAccessInterfaceImpl::SetCapabilityParamRule(ZekAccess_CapabilityParamRule) {
  Refuse("SetCapabilityParamRule");
}

void ZekAccessInterfaceImpl::SetObjectAccessRule(ZekAccess_ObjectAccessRule) {
  Refuse("SetObjectAccessRule");
}

void ZekAccessInterfaceImpl::SetDomTransRule(ZekAccess_DomTransRule) { Refuse("SetDomTransRule"); }

void ZekAccessInterfaceImpl::SetFileCreationRule(ZekAccess_FileCreationRule) {
  Refuse("SetFileCreationRule");
}

void ZekAccessInterfaceImpl::SetUnixSockCreationRule(ZekAccess_UnixSockCreationRule) {
  Refuse("SetUnixSockCreationRule");
}

void ZekAccessInterfaceImpl::CheckCapabilityParamRuleConstraints(
    std::string, std::list<ZekAccess_CapabilityParamRule>) {
  Refuse("CheckCapabilityParamRuleConstraints");
}

void ZekAccessInterfaceImpl::GetSyscallRules(unsigned int, std::list<ZekAccess_SyscallRule>&) {
  Refuse("GetSyscallRules");
}

void ZekAccessInterfaceImpl::GetFilePathAccessRules(unsigned int,
                                                    std::list<ZekAccess_FilePathAccessRule>&) {
  Refuse("GetFilePathAccessRules");
}

void ZekAccessInterfaceImpl::GetCapabilityRules(unsigned int,
                                                std::list<ZekAccess_CapabilityRule>&) {
  Refuse("GetCapabilityRules");
}

void ZekAccessInterfaceImpl::GetCapabilityParamRules(unsigned int,
                                                     std::list<ZekAccess_CapabilityParamRule>&) {
  Refuse("GetCapabilityParamRules");
}

void ZekAccessInterfaceImpl::GetObjectAccessRules(unsigned int,
                                                  std::list<ZekAccess_ObjectAccessRule>&) {
  Refuse("GetObjectAccessRules");
}

void ZekAccessInterfaceImpl::GetDomTransRules(unsigned int, std::list<ZekAccess_DomTransRule>&) {
  Refuse("GetDomTransRules");
}

void ZekAccessInterfaceImpl::GetFileCreationRules(unsigned int,
                                                  std::list<ZekAccess_FileCreationRule>&) {
  Refuse("GetFileCreationRules");
}

void ZekAccessInterfaceImpl::GetUnixSockCreationRules(unsigned int,
                                                      std::list<ZekAccess_UnixSockCreationRule>&) {
  Refuse("GetUnixSockCreationRules");
}

// ---- Labels ------------------------------------------------------------------------------------

std::vector<std::string> ZekAccessInterfaceImpl::GetInvalidLabels(ZekAccessLabelType) {
  Refuse("GetInvalidLabels");
}

void ZekAccessInterfaceImpl::AddLabels(std::vector<std::string>, ZekAccessLabelType) {
  Refuse("AddLabels");
}

void ZekAccessInterfaceImpl::RemoveLabels(std::vector<std::string>, ZekAccessLabelType) {
  Refuse("RemoveLabels");
}

bool ZekAccessInterfaceImpl::IsPredefinedLabel(std::string, ZekAccessLabelType) {
  Refuse("IsPredefinedLabel");
}

bool ZekAccessInterfaceImpl::IsPrivilegedVm(const std::string&) { Refuse("IsPrivilegedVm"); }

unsigned int ZekAccessInterfaceImpl::LookupLabel(std::string, ZekAccessLabelType) {
  Refuse("LookupLabel");
}

std::string ZekAccessInterfaceImpl::GetLabel(unsigned int, ZekAccessLabelType) {
  Refuse("GetLabel");
}

// ---- Tardisks ----------------------------------------------------------------------------------

std::string ZekAccessInterfaceImpl::GetTardiskLaunchDomain() { Refuse("GetTardiskLaunchDomain"); }

std::string ZekAccessInterfaceImpl::GetTardiskExecEventKeyword() {
  Refuse("GetTardiskExecEventKeyword");
}

std::string ZekAccessInterfaceImpl::GetDefaultTardiskLabel() { Refuse("GetDefaultTardiskLabel"); }

std::string ZekAccessInterfaceImpl::GetDefaultTardiskDomain() { Refuse("GetDefaultTardiskDomain"); }

}  // namespace ZekCtl::Security

namespace ZekCtl::Util {

// The node and the instance that are asked.
struct Sysinfo::State {};

Sysinfo::Sysinfo(unsigned int) : state_(std::make_unique<State>()) {}

Sysinfo::~Sysinfo() = default;

void Sysinfo::AddInstancePath(const unsigned long&) { Refuse("Sysinfo::AddInstancePath"); }

void Sysinfo::Get(void*, unsigned int) { Refuse("Sysinfo::Get"); }

}  // namespace ZekCtl::Util
