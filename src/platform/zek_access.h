// The platform's kernel-access library: typed operations on the kernel's security module.
#pragma once

#include <cstddef>
#include <cstdint>
#include <list>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "private_calls.h"

namespace ZekCtl::Security {

// ---- Rule records --------------------------------------------------------------------------
//
// Widths and order of the fields are binding: records are handed over as they are. `line` is the
// rule's line in its policy file, 0 when there is none. `grant` is true for "grant" and false for
// "revoke".

struct ZekAccess_FilePathAccessRule {
  std::uint32_t line = 0;
  std::uint32_t domainId = 0;
  std::string domainName;
  std::string path;
  std::string permissions;  // letters of "rwx"; may be empty
};

struct ZekAccess_SyscallRule {
  std::uint32_t line = 0;
  std::uint32_t domainId = 0;
  std::string domainName;
  std::string syscall;
  bool grant = false;
};

struct ZekAccess_CapabilityRule {
  std::uint32_t line = 0;
  std::uint32_t domainId = 0;
  std::string domainName;
  std::string capability;
  bool grant = false;
};

struct ZekAccess_CapabilityParamRule {
  std::uint32_t line = 0;
  std::uint32_t domainId = 0;
  std::string domainName;
  std::string capability;
  std::string parameter;
  bool grant = false;
};

struct ZekAccess_ObjectAccessRule {
  std::uint32_t line = 0;
  std::uint32_t domainId = 0;
  std::string domainName;
  std::string object;
  std::string access;
  bool grant = false;
};

struct ZekAccess_UnixSockCreationRule {
  std::uint32_t line = 0;
  std::uint32_t domainId = 0;
  std::string domainName;
  std::string label;
  std::string sockType;
  bool grant = false;
};

struct ZekAccess_FileCreationRule {
  std::uint32_t line = 0;
  std::uint32_t domainId = 0;
  std::string domainName;
  std::string parentLabel;
  std::string fileLabel;
  std::string fileType;
  bool grant = false;
};

struct ZekAccess_DomTransRule {
  std::uint32_t line = 0;
  std::uint32_t domainId = 0;
  std::string domainName;
  std::string label;
  std::string targetDomain;
  std::uint32_t targetDomainId = 0;
  std::string transition;
  bool grant = false;
};

// One file rule as exchanged with the private calls; an array of them is contiguous.
struct ZekAccess_FileRule {
  char path[Kernel::kPathBytes];  // absolute, NUL-terminated
  std::uint32_t permission;       // 0x1 read, 0x2 write, 0x10 execute
};
static_assert(sizeof(ZekAccess_FileRule) == 1988 && alignof(ZekAccess_FileRule) == 4);
static_assert(offsetof(ZekAccess_FileRule, permission) == 1984);

// ---- Words and labels ----------------------------------------------------------------------

// The word list that a word of a rule is validated against.
enum ZekAccess_KeywordType : unsigned int {
  kObjectKeyword = 1,           // object labels
  kCapabilityKeyword = 2,       // capabilities
  kCapabilityParamKeyword = 3,  // capabilities that take a parameter
  kObjectAccessKeyword = 4,     // accesses to an object
  kTransitionKeyword = 5,       // events at which a domain transition happens
  kFileTypeKeyword = 6,         // types of files
  kSockTypeKeyword = 7,         // types of Unix sockets
  kSyscallKeyword = 8,          // system calls
};

enum ZekAccessLabelType : unsigned int { kDomainLabel = 0, kObjectLabel = 1 };

// ---- The interface -------------------------------------------------------------------------

// An open connection to the kernel's security module. Every operation may throw
// Tavon::Lib::TavonException with a complete message; what an operation had done before it threw
// stays done.
class [[gnu::visibility("default")]] ZekAccessInterfaceImpl {
 public:
  ZekAccessInterfaceImpl();
  ~ZekAccessInterfaceImpl();
  ZekAccessInterfaceImpl(const ZekAccessInterfaceImpl&) = delete;
  ZekAccessInterfaceImpl& operator=(const ZekAccessInterfaceImpl&) = delete;

  // True, and the id in `*id`, when a domain of that name exists; else false, `*id` unchanged.
  bool FindDomain(std::string name, unsigned int* id);
  // Tell the kernel which domain plays the role.
  void SetGlobalVMDomain(unsigned int id);
  void SetIoFilterDomain(unsigned int id);
  // Number of domain slots; ids are below it.
  unsigned int GetMaxDomains();
  // False, and nothing filled in, when no domain has that id.
  bool GetCompleteDomainInfo(unsigned int id, std::string& name, std::string& enforcementLevel,
                             unsigned int& state, unsigned int& refCount,
                             unsigned int& worldRefCount);
  // Allows the domain the named guest communication service.
  void AddUlvoService(unsigned int domainId, const std::string& service);

  // Throws unless the list holds the word.
  void ValidateKeyword(ZekAccess_KeywordType type, std::string word);
  // The list's words and their kernel ids.
  std::map<std::string, long> GetKeywordsMap(ZekAccess_KeywordType type);

  // Install one rule. A rule set twice counts once; the later decision wins.
  void SetSyscallRule(ZekAccess_SyscallRule rule);
  void SetCapabilityRule(ZekAccess_CapabilityRule rule);
  void SetCapabilityParamRule(ZekAccess_CapabilityParamRule rule);
  void SetObjectAccessRule(ZekAccess_ObjectAccessRule rule);
  void SetDomTransRule(ZekAccess_DomTransRule rule);
  void SetFileCreationRule(ZekAccess_FileCreationRule rule);
  void SetUnixSockCreationRule(ZekAccess_UnixSockCreationRule rule);
  // Throws when the rules of one domain contradict each other.
  void CheckCapabilityParamRuleConstraints(std::string domainName,
                                           std::list<ZekAccess_CapabilityParamRule> rules);

  // Append the rules that the kernel holds for the domain.
  void GetSyscallRules(unsigned int domainId, std::list<ZekAccess_SyscallRule>& rules);
  void GetFilePathAccessRules(unsigned int domainId,
                              std::list<ZekAccess_FilePathAccessRule>& rules);
  void GetCapabilityRules(unsigned int domainId, std::list<ZekAccess_CapabilityRule>& rules);
  void GetCapabilityParamRules(unsigned int domainId,
                               std::list<ZekAccess_CapabilityParamRule>& rules);
  void GetObjectAccessRules(unsigned int domainId, std::list<ZekAccess_ObjectAccessRule>& rules);
  void GetDomTransRules(unsigned int domainId, std::list<ZekAccess_DomTransRule>& rules);
  void GetFileCreationRules(unsigned int domainId, std::list<ZekAccess_FileCreationRule>& rules);
  void GetUnixSockCreationRules(unsigned int domainId,
                                std::list<ZekAccess_UnixSockCreationRule>& rules);

  // Labels whose kernel values are no longer valid.
  std::vector<std::string> GetInvalidLabels(ZekAccessLabelType type);
  // Define labels; a label that exists stays as it is.
  void AddLabels(std::vector<std::string> labels, ZekAccessLabelType type);
  // Remove labels; an unknown one is passed over.
  void RemoveLabels(std::vector<std::string> labels, ZekAccessLabelType type);
  bool IsPredefinedLabel(std::string label, ZekAccessLabelType type);
  bool IsPrivilegedVm(const std::string& name);
  // A label's id by its name, and its name by its id; both throw for an unknown one.
  unsigned int LookupLabel(std::string label, ZekAccessLabelType type);
  std::string GetLabel(unsigned int id, ZekAccessLabelType type);

  // The domain in which programs from tardisks are started, and the event of their execution.
  std::string GetTardiskLaunchDomain();
  std::string GetTardiskExecEventKeyword();
  // What a tardisk without a policy of its own gets.
  std::string GetDefaultTardiskLabel();
  std::string GetDefaultTardiskDomain();

 private:
  struct State;  // defined by whoever implements the class
  std::unique_ptr<State> state_;
};

}  // namespace ZekCtl::Security

namespace SecPolicy {
using ZekCtl::Security::ZekAccess_FileRule;
}  // namespace SecPolicy
