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

// Rule type "-r": the domain's access to a path.
struct ZekAccess_FilePathAccessRule {
  std::uint32_t line = 0;      // in the policy file; 0 when there is none
  std::uint32_t domainId = 0;  // the domain that the rule is of
  std::string domainName;      // the name of that domain
  std::string path;            // of a file or a directory
  std::string permissions;     // letters of "rwx"; may be empty
};

// Rule type "-s": whether the domain may make a system call.
struct ZekAccess_SyscallRule {
  std::uint32_t line = 0;      // in the policy file; 0 when there is none
  std::uint32_t domainId = 0;  // the domain that the rule is of
  std::string domainName;      // the name of that domain
  std::string syscall;         // its name
  bool grant = false;          // false for "revoke"
};

// Rule type "-c": whether the domain has a capability.
struct ZekAccess_CapabilityRule {
  std::uint32_t line = 0;      // in the policy file; 0 when there is none
  std::uint32_t domainId = 0;  // the domain that the rule is of
  std::string domainName;      // the name of that domain
  std::string capability;      // its name
  bool grant = false;          // false for "revoke"
};

// Rule type "-p": whether the domain has a capability for one parameter.
struct ZekAccess_CapabilityParamRule {
  std::uint32_t line = 0;      // in the policy file; 0 when there is none
  std::uint32_t domainId = 0;  // the domain that the rule is of
  std::string domainName;      // the name of that domain
  std::string capability;      // its name
  std::string parameter;       // a free word
  bool grant = false;          // false for "revoke"
};

// Rule type "-a": whether the domain may access what carries a label.
struct ZekAccess_ObjectAccessRule {
  std::uint32_t line = 0;      // in the policy file; 0 when there is none
  std::uint32_t domainId = 0;  // the domain that the rule is of
  std::string domainName;      // the name of that domain
  std::string object;          // the label
  std::string access;          // a word of kObjectAccessKeyword
  bool grant = false;          // false for "revoke"
};

// Rule type "-u": whether the domain may create Unix sockets.
struct ZekAccess_UnixSockCreationRule {
  std::uint32_t line = 0;      // in the policy file; 0 when there is none
  std::uint32_t domainId = 0;  // the domain that the rule is of
  std::string domainName;      // the name of that domain
  std::string label;           // of the socket
  std::string sockType;        // a word of kSockTypeKeyword
  bool grant = false;          // false for "revoke"
};

// Rule type "-f": whether the domain may create files.
struct ZekAccess_FileCreationRule {
  std::uint32_t line = 0;      // in the policy file; 0 when there is none
  std::uint32_t domainId = 0;  // the domain that the rule is of
  std::string domainName;      // the name of that domain
  std::string parentLabel;     // of the directory
  std::string fileLabel;       // of the new file
  std::string fileType;        // a word of kFileTypeKeyword
  bool grant = false;          // false for "revoke"
};

// Rule type "-d": whether the domain's programs go to another domain at an event.
struct ZekAccess_DomTransRule {
  std::uint32_t line = 0;            // in the policy file; 0 when there is none
  std::uint32_t domainId = 0;        // the domain that the rule is of
  std::string domainName;            // the name of that domain
  std::string label;                 // what the event happens to
  std::string targetDomain;          // the name of the domain that they go to
  std::uint32_t targetDomainId = 0;  // its kernel id
  std::string transition;            // the event: a word of kTransitionKeyword
  bool grant = false;                // false for "revoke"
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

// The two spaces of names to which the kernel gives ids of their own.
enum ZekAccessLabelType : unsigned int {
  kDomainLabel = 0,  // domains
  kObjectLabel = 1,  // objects, which files carry
};

// ---- The interface -------------------------------------------------------------------------

// An open connection to the kernel's security module. Every operation may throw
// Tavon::Lib::TavonException with a complete message; what an operation had done before it threw
// stays done.
class [[gnu::visibility("default")]] ZekAccessInterfaceImpl {
 public:
  // Opens the connection. Throws when the security module cannot be reached.
  ZekAccessInterfaceImpl();
  // Closes it.
  ~ZekAccessInterfaceImpl();
  ZekAccessInterfaceImpl(const ZekAccessInterfaceImpl&) = delete;
  ZekAccessInterfaceImpl& operator=(const ZekAccessInterfaceImpl&) = delete;

  // True, and the id in `*id`, when a domain of that name exists; else false, `*id` unchanged.
  bool FindDomain(std::string name, unsigned int* id);
  // Tells the kernel which domain is that of virtual machines.
  void SetGlobalVMDomain(unsigned int id);
  // Tells the kernel which domain is that of I/O filters.
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

  // Installs one rule. A rule set twice counts once; the later decision wins.
  void SetSyscallRule(ZekAccess_SyscallRule rule);
  void SetCapabilityRule(ZekAccess_CapabilityRule rule);              // as SetSyscallRule
  void SetCapabilityParamRule(ZekAccess_CapabilityParamRule rule);    // as SetSyscallRule
  void SetObjectAccessRule(ZekAccess_ObjectAccessRule rule);          // as SetSyscallRule
  void SetDomTransRule(ZekAccess_DomTransRule rule);                  // as SetSyscallRule
  void SetFileCreationRule(ZekAccess_FileCreationRule rule);          // as SetSyscallRule
  void SetUnixSockCreationRule(ZekAccess_UnixSockCreationRule rule);  // as SetSyscallRule
  // Throws when the rules of one domain contradict each other.
  void CheckCapabilityParamRuleConstraints(std::string domainName,
                                           std::list<ZekAccess_CapabilityParamRule> rules);

  // Appends the rules that the kernel holds for the domain.
  void GetSyscallRules(unsigned int domainId, std::list<ZekAccess_SyscallRule>& rules);
  void GetFilePathAccessRules(
      unsigned int domainId,
      std::list<ZekAccess_FilePathAccessRule>& rules);  // as GetSyscallRules
  void GetCapabilityRules(unsigned int domainId,
                          std::list<ZekAccess_CapabilityRule>& rules);  // as GetSyscallRules
  void GetCapabilityParamRules(
      unsigned int domainId,
      std::list<ZekAccess_CapabilityParamRule>& rules);  // as GetSyscallRules
  void GetObjectAccessRules(unsigned int domainId,
                            std::list<ZekAccess_ObjectAccessRule>& rules);  // as GetSyscallRules
  void GetDomTransRules(unsigned int domainId,
                        std::list<ZekAccess_DomTransRule>& rules);  // as GetSyscallRules
  void GetFileCreationRules(unsigned int domainId,
                            std::list<ZekAccess_FileCreationRule>& rules);  // as GetSyscallRules
  void GetUnixSockCreationRules(
      unsigned int domainId,
      std::list<ZekAccess_UnixSockCreationRule>& rules);  // as GetSyscallRules

  // Labels whose kernel values are no longer valid.
  std::vector<std::string> GetInvalidLabels(ZekAccessLabelType type);
  // Defines labels; a label that exists stays as it is.
  void AddLabels(std::vector<std::string> labels, ZekAccessLabelType type);
  // Removes labels; an unknown one is passed over.
  void RemoveLabels(std::vector<std::string> labels, ZekAccessLabelType type);
  // Whether the kernel itself defines the label.
  bool IsPredefinedLabel(std::string label, ZekAccessLabelType type);
  // Whether the domain label is that of a privileged virtual machine.
  bool IsPrivilegedVm(const std::string& name);
  // The label's id; throws for an unknown one.
  unsigned int LookupLabel(std::string label, ZekAccessLabelType type);
  // The name of the label with that id; throws for an unknown one.
  std::string GetLabel(unsigned int id, ZekAccessLabelType type);

  // The domain in which programs from tardisks are started.
  std::string GetTardiskLaunchDomain();
  // The event of their execution, a word of kTransitionKeyword.
  std::string GetTardiskExecEventKeyword();
  // The label of a tardisk without a policy of its own.
  std::string GetDefaultTardiskLabel();
  // The domain to which programs of such a tardisk go.
  std::string GetDefaultTardiskDomain();

 private:
  struct State;  // defined by whoever implements the class
  std::unique_ptr<State> state_;
};

}  // namespace ZekCtl::Security

namespace SecPolicy {
using ZekCtl::Security::ZekAccess_FileRule;
}  // namespace SecPolicy
