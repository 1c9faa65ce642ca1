#include "domain/keyword_rules.h"

#include "platform/tavon_strcat.h"

namespace SecPolicy {

using namespace ZekCtl::Security;
using Tavon::Lib::TavonException;
using Tavon::Misc::StrCat;

void LookUpTargetDomain(ZekAccess_DomTransRule& rule, ZekAccessInterfaceImpl& iface) {
  if (!iface.FindDomain(rule.targetDomain, &rule.targetDomainId)) {
    throw TavonException("Failed to fetch domain id for: " + rule.targetDomain);
  }
}

namespace {

std::string TakeFront(std::queue<std::string>& words) {
  std::string word = std::move(words.front());
  words.pop();
  return word;
}

}  // namespace

// ---- What they share ---------------------------------------------------------------------------

template <typename Type>
void KeywordRules<Type>::AddRule(unsigned int line, std::string domainName, unsigned int domainId,
                                 std::queue<std::string> args, ZekAccessInterfaceImpl& iface) try {
  if (args.size() != Type::kWords.size() + 1) RuleSizeError();
  // Filled where it stays: a record is a handful of strings.
  std::list<Record> added(1);
  Record& rule = added.front();
  rule.line = line;
  rule.domainId = domainId;
  rule.domainName = domainName;
  TakeWords(rule, args, iface);
  ValidateWords(rule, iface);
  rules_.splice(rules_.end(), added);
} catch (const TavonException& failure) {
  ThrowDomainParseError(line, domainName, failure.what());
}

template <typename Type>
void KeywordRules<Type>::TakeWords(Record& rule, std::queue<std::string>& args,
                                   ZekAccessInterfaceImpl& iface) {
  for (const RuleWord<Record>& word : Type::kWords) {
    rule.*word.field = TakeFront(args);
    if (word.taken != nullptr) word.taken(rule, iface);
  }
  rule.grant = IsGrant(args.front());
}

template <typename Type>
void KeywordRules<Type>::ValidateWords(const Record& rule, ZekAccessInterfaceImpl& iface) {
  for (const RuleWord<Record>& word : Type::kWords) {
    if (word.list) iface.ValidateKeyword(*word.list, rule.*word.field);
  }
}

template <typename Type>
void KeywordRules<Type>::Set(ZekAccessInterfaceImpl& iface) {
  for (const Record& rule : rules_) {
    try {
      (iface.*Type::kSet)(rule);
    } catch (const TavonException& failure) {
      ThrowDomainSetError(rule.line, rule.domainName, failure.what());
    }
  }
}

template <typename Type>
void KeywordRules<Type>::ReadSystemRules(unsigned int domainId, ZekAccessInterfaceImpl& iface) {
  (iface.*Type::kGet)(domainId, rules_);
}

template <typename Type>
void KeywordRules<Type>::CheckConstraints(std::string, ZekAccessInterfaceImpl&) {}

template <typename Type>
void KeywordRules<Type>::PrintRules() {
  for (const Record& rule : rules_) {
    std::string text = Keyword();
    for (const RuleWord<Record>& word : Type::kWords) text += " " + rule.*word.field;
    PrintLine(text + (rule.grant ? " grant" : " revoke"));
  }
}

// ---- What one of them adds ---------------------------------------------------------------------

void CapabilityParamRules::CheckConstraints(std::string domainName,
                                            ZekAccessInterfaceImpl& iface) try {
  iface.CheckCapabilityParamRuleConstraints(domainName, Rules());
} catch (const TavonException& failure) {
  throw TavonException(
      StrCat("Policy constraint error for domain: ", domainName, " : ", failure.what()));
}

template class KeywordRules<SyscallRuleType>;
template class KeywordRules<CapabilityRuleType>;
template class KeywordRules<CapabilityParamRuleType>;
template class KeywordRules<ObjectAccessRuleType>;
template class KeywordRules<UnixSockCreationRuleType>;
template class KeywordRules<FileCreationRuleType>;
template class KeywordRules<DomTransRuleType>;

}  // namespace SecPolicy
