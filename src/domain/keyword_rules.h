// The rule types that consist of words and end in "grant" or "revoke".
//
// They are one family. What they share is written once, in KeywordRules; what differs stands in
// their rows of platform/rule_types.h.
#pragma once

#include <list>
#include <queue>
#include <string>
#include <utility>

#include "core/diagnostics.h"
#include "domain/policy_rules.h"
#include "platform/rule_types.h"

namespace SecPolicy {

// The behaviour of PolicyRules for the type of one record.
template <typename Record>
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
  [[nodiscard]] const std::list<Record>& Rules() const noexcept { return rules_; }

 private:
  static constexpr const ZekCtl::Security::RuleRow<Record>& kRow =
      ZekCtl::Security::kRuleRow<Record>;

  static void TakeWords(Record& rule, std::queue<std::string>& args, ZekAccessInterfaceImpl& iface);
  static void ValidateWords(const Record& rule, ZekAccessInterfaceImpl& iface);

  std::list<Record> rules_;
};

class SyscallRules : public virtual PolicyRules,
                     public KeywordRules<ZekCtl::Security::ZekAccess_SyscallRule> {};
class CapabilityRules : public virtual PolicyRules,
                        public KeywordRules<ZekCtl::Security::ZekAccess_CapabilityRule> {};
class ObjectAccessRules : public virtual PolicyRules,
                          public KeywordRules<ZekCtl::Security::ZekAccess_ObjectAccessRule> {};
class DomTransRules : public virtual PolicyRules,
                      public KeywordRules<ZekCtl::Security::ZekAccess_DomTransRule> {};
class FileCreationRules : public virtual PolicyRules,
                          public KeywordRules<ZekCtl::Security::ZekAccess_FileCreationRule> {};
class UnixSockCreationRules
    : public virtual PolicyRules,
      public KeywordRules<ZekCtl::Security::ZekAccess_UnixSockCreationRule> {};

class CapabilityParamRules : public virtual PolicyRules,
                             public KeywordRules<ZekCtl::Security::ZekAccess_CapabilityParamRule> {
 public:
  // Has the kernel-access library look for contradictions in the whole list. Throws "Policy
  // constraint error for domain: " + domain + " : " and the library's text.
  void CheckConstraints(std::string domainName, ZekAccessInterfaceImpl& iface) override;
};

// ---- What they share ---------------------------------------------------------------------------

// The id of the domain. Throws "Failed to fetch domain id for: " + name. All domains exist by the
// time that rules are parsed, so a name that is not found is a mistake of the line.
unsigned int IdOfDomain(const std::string& name, ZekAccessInterfaceImpl& iface);

template <typename Record>
void KeywordRules<Record>::AddRule(unsigned int line, std::string domainName, unsigned int domainId,
                                   std::queue<std::string> args,
                                   ZekAccessInterfaceImpl& iface) try {
  if (args.size() != kRow.Words().size() + 1) RuleSizeError();
  // Filled where it stays: a record is a handful of strings.
  std::list<Record> added(1);
  Record& rule = added.front();
  rule.line = line;
  rule.domainId = domainId;
  rule.domainName = domainName;
  TakeWords(rule, args, iface);
  ValidateWords(rule, iface);
  rules_.splice(rules_.end(), added);
} catch (const Tavon::Lib::TavonException& failure) {
  ThrowDomainParseError(line, domainName, failure.what());
}

// A domain is looked up as soon as its word is taken, before the words after it are looked at.
template <typename Record>
void KeywordRules<Record>::TakeWords(Record& rule, std::queue<std::string>& args,
                                     ZekAccessInterfaceImpl& iface) {
  for (const auto& word : kRow.Words()) {
    rule.*word.field = std::move(args.front());
    args.pop();
    if (word.domainId != nullptr) rule.*word.domainId = IdOfDomain(rule.*word.field, iface);
  }
  rule.grant = IsGrant(args.front());
}

template <typename Record>
void KeywordRules<Record>::ValidateWords(const Record& rule, ZekAccessInterfaceImpl& iface) {
  for (const auto& word : kRow.Words()) {
    if (word.info.list) iface.ValidateKeyword(*word.info.list, rule.*word.field);
  }
}

template <typename Record>
void KeywordRules<Record>::Set(ZekAccessInterfaceImpl& iface) {
  for (const Record& rule : rules_) {
    try {
      (iface.*kRow.set)(rule);
    } catch (const Tavon::Lib::TavonException& failure) {
      ThrowDomainSetError(rule.line, rule.domainName, failure.what());
    }
  }
}

template <typename Record>
void KeywordRules<Record>::ReadSystemRules(unsigned int domainId, ZekAccessInterfaceImpl& iface) {
  (iface.*kRow.get)(domainId, rules_);
}

template <typename Record>
void KeywordRules<Record>::CheckConstraints(std::string, ZekAccessInterfaceImpl&) {}

template <typename Record>
void KeywordRules<Record>::PrintRules() {
  for (const Record& rule : rules_) {
    std::string text = Keyword();
    for (const auto& word : kRow.Words()) text += " " + rule.*word.field;
    PrintLine(text + (rule.grant ? " grant" : " revoke"));
  }
}

}  // namespace SecPolicy
