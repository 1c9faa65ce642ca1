// The rule types that consist of words and end in "grant" or "revoke".
//
// They are one family. What they share is written once, in KeywordRules; what differs is said by a
// type of three members: the record, the words of a line in their order, and the two operations of
// the kernel-access library.
#pragma once

#include <array>
#include <list>
#include <optional>
#include <string>

#include "core/diagnostics.h"
#include "domain/policy_rules.h"

namespace SecPolicy {

// One word of a rule line.
template <typename Record>
struct RuleWord {
  std::string Record::*field;
  // The word list that must hold the word; nothing for a free word.
  std::optional<ZekCtl::Security::ZekAccess_KeywordType> list = std::nullopt;
  // Called once the word is taken, before the words behind it are looked at.
  void (*taken)(Record&, ZekAccessInterfaceImpl&) = nullptr;
};

// Stores the id of the rule's target domain. Throws "Failed to fetch domain id for: " + the target.
// All domains exist by the time that rules are parsed, so a target that is not found is a mistake
// of the line, and it is reported before anything behind it on the line.
void LookUpTargetDomain(ZekCtl::Security::ZekAccess_DomTransRule& rule,
                        ZekAccessInterfaceImpl& iface);

struct SyscallRuleType {
  using Record = ZekCtl::Security::ZekAccess_SyscallRule;
  static constexpr std::array<RuleWord<Record>, 1> kWords{{
      {&Record::syscall, ZekCtl::Security::kSyscallKeyword},
  }};
  static constexpr auto kSet = &ZekAccessInterfaceImpl::SetSyscallRule;
  static constexpr auto kGet = &ZekAccessInterfaceImpl::GetSyscallRules;
};

struct CapabilityRuleType {
  using Record = ZekCtl::Security::ZekAccess_CapabilityRule;
  static constexpr std::array<RuleWord<Record>, 1> kWords{{
      {&Record::capability, ZekCtl::Security::kCapabilityKeyword},
  }};
  static constexpr auto kSet = &ZekAccessInterfaceImpl::SetCapabilityRule;
  static constexpr auto kGet = &ZekAccessInterfaceImpl::GetCapabilityRules;
};

struct CapabilityParamRuleType {
  using Record = ZekCtl::Security::ZekAccess_CapabilityParamRule;
  static constexpr std::array<RuleWord<Record>, 2> kWords{{
      {&Record::capability, ZekCtl::Security::kCapabilityParamKeyword},
      {&Record::parameter},
  }};
  static constexpr auto kSet = &ZekAccessInterfaceImpl::SetCapabilityParamRule;
  static constexpr auto kGet = &ZekAccessInterfaceImpl::GetCapabilityParamRules;
};

struct ObjectAccessRuleType {
  using Record = ZekCtl::Security::ZekAccess_ObjectAccessRule;
  static constexpr std::array<RuleWord<Record>, 2> kWords{{
      {&Record::object, ZekCtl::Security::kObjectKeyword},
      {&Record::access, ZekCtl::Security::kObjectAccessKeyword},
  }};
  static constexpr auto kSet = &ZekAccessInterfaceImpl::SetObjectAccessRule;
  static constexpr auto kGet = &ZekAccessInterfaceImpl::GetObjectAccessRules;
};

struct UnixSockCreationRuleType {
  using Record = ZekCtl::Security::ZekAccess_UnixSockCreationRule;
  static constexpr std::array<RuleWord<Record>, 2> kWords{{
      {&Record::label, ZekCtl::Security::kObjectKeyword},
      {&Record::sockType, ZekCtl::Security::kSockTypeKeyword},
  }};
  static constexpr auto kSet = &ZekAccessInterfaceImpl::SetUnixSockCreationRule;
  static constexpr auto kGet = &ZekAccessInterfaceImpl::GetUnixSockCreationRules;
};

struct FileCreationRuleType {
  using Record = ZekCtl::Security::ZekAccess_FileCreationRule;
  static constexpr std::array<RuleWord<Record>, 3> kWords{{
      {&Record::parentLabel, ZekCtl::Security::kObjectKeyword},
      {&Record::fileLabel, ZekCtl::Security::kObjectKeyword},
      {&Record::fileType, ZekCtl::Security::kFileTypeKeyword},
  }};
  static constexpr auto kSet = &ZekAccessInterfaceImpl::SetFileCreationRule;
  static constexpr auto kGet = &ZekAccessInterfaceImpl::GetFileCreationRules;
};

struct DomTransRuleType {
  using Record = ZekCtl::Security::ZekAccess_DomTransRule;
  static constexpr std::array<RuleWord<Record>, 3> kWords{{
      {&Record::label, ZekCtl::Security::kObjectKeyword},
      {&Record::targetDomain, std::nullopt, LookUpTargetDomain},
      {&Record::transition, ZekCtl::Security::kTransitionKeyword},
  }};
  static constexpr auto kSet = &ZekAccessInterfaceImpl::SetDomTransRule;
  static constexpr auto kGet = &ZekAccessInterfaceImpl::GetDomTransRules;
};

// The behaviour of PolicyRules for one member of the family.
template <typename Type>
class KeywordRules : public virtual PolicyRules {
 public:
  void AddRule(unsigned int line, std::string domainName, unsigned int domainId,
               std::queue<std::string> args, ZekAccessInterfaceImpl& iface) override;
  void Set(ZekAccessInterfaceImpl& iface) override;
  void ReadSystemRules(unsigned int domainId, ZekAccessInterfaceImpl& iface) override;
  // Does nothing.
  void CheckConstraints(std::string domainName, ZekAccessInterfaceImpl& iface) override;
  void PrintRules() override;

 protected:
  using Record = typename Type::Record;

  [[nodiscard]] const std::list<Record>& Rules() const noexcept { return rules_; }

 private:
  static void TakeWords(Record& rule, std::queue<std::string>& args, ZekAccessInterfaceImpl& iface);
  static void ValidateWords(const Record& rule, ZekAccessInterfaceImpl& iface);

  std::list<Record> rules_;
};

class SyscallRules : public virtual PolicyRules, public KeywordRules<SyscallRuleType> {};
class CapabilityRules : public virtual PolicyRules, public KeywordRules<CapabilityRuleType> {};
class ObjectAccessRules : public virtual PolicyRules, public KeywordRules<ObjectAccessRuleType> {};
class DomTransRules : public virtual PolicyRules, public KeywordRules<DomTransRuleType> {};
class FileCreationRules : public virtual PolicyRules, public KeywordRules<FileCreationRuleType> {};
class UnixSockCreationRules : public virtual PolicyRules,
                              public KeywordRules<UnixSockCreationRuleType> {};

class CapabilityParamRules : public virtual PolicyRules,
                             public KeywordRules<CapabilityParamRuleType> {
 public:
  // Has the kernel-access library look for contradictions in the whole list. Throws "Policy
  // constraint error for domain: " + domain + " : " and the library's text.
  void CheckConstraints(std::string domainName, ZekAccessInterfaceImpl& iface) override;
};

extern template class KeywordRules<SyscallRuleType>;
extern template class KeywordRules<CapabilityRuleType>;
extern template class KeywordRules<CapabilityParamRuleType>;
extern template class KeywordRules<ObjectAccessRuleType>;
extern template class KeywordRules<UnixSockCreationRuleType>;
extern template class KeywordRules<FileCreationRuleType>;
extern template class KeywordRules<DomTransRuleType>;

}  // namespace SecPolicy
