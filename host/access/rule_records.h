// The access library's rule records and the module's rules, each made from the other.
#pragma once

#include <list>
#include <string>
#include <utility>
#include <vector>

#include "host/module/rule.h"
#include "platform/zek_access.h"

namespace StandIn {

// By record: its kind, and its fields that are words, in the order of the module's words.
template <typename Record>
struct RecordShape;

template <>
struct RecordShape<ZekCtl::Security::ZekAccess_SyscallRule> {
  using Record = ZekCtl::Security::ZekAccess_SyscallRule;
  static constexpr RuleKind kKind = RuleKind::kSyscall;
  static constexpr std::array kWords{&Record::syscall};
};

template <>
struct RecordShape<ZekCtl::Security::ZekAccess_CapabilityRule> {
  using Record = ZekCtl::Security::ZekAccess_CapabilityRule;
  static constexpr RuleKind kKind = RuleKind::kCapability;
  static constexpr std::array kWords{&Record::capability};
};

template <>
struct RecordShape<ZekCtl::Security::ZekAccess_CapabilityParamRule> {
  using Record = ZekCtl::Security::ZekAccess_CapabilityParamRule;
  static constexpr RuleKind kKind = RuleKind::kCapabilityParam;
  static constexpr std::array kWords{&Record::capability, &Record::parameter};
};

template <>
struct RecordShape<ZekCtl::Security::ZekAccess_ObjectAccessRule> {
  using Record = ZekCtl::Security::ZekAccess_ObjectAccessRule;
  static constexpr RuleKind kKind = RuleKind::kObjectAccess;
  static constexpr std::array kWords{&Record::object, &Record::access};
};

template <>
struct RecordShape<ZekCtl::Security::ZekAccess_DomTransRule> {
  using Record = ZekCtl::Security::ZekAccess_DomTransRule;
  static constexpr RuleKind kKind = RuleKind::kTransition;
  static constexpr std::array kWords{&Record::label, &Record::targetDomain, &Record::transition};
};

template <>
struct RecordShape<ZekCtl::Security::ZekAccess_FileCreationRule> {
  using Record = ZekCtl::Security::ZekAccess_FileCreationRule;
  static constexpr RuleKind kKind = RuleKind::kFileCreation;
  static constexpr std::array kWords{&Record::parentLabel, &Record::fileLabel, &Record::fileType};
};

template <>
struct RecordShape<ZekCtl::Security::ZekAccess_UnixSockCreationRule> {
  using Record = ZekCtl::Security::ZekAccess_UnixSockCreationRule;
  static constexpr RuleKind kKind = RuleKind::kUnixSocket;
  static constexpr std::array kWords{&Record::label, &Record::sockType};
};

template <typename Record>
constexpr bool kHasTarget = requires(Record record) {
  record.targetDomainId;
};

template <typename Record>
Rule ToRule(Record record) {
  Rule rule;
  rule.line = record.line;
  rule.decision = record.grant ? Decision::kGrant : Decision::kRevoke;
  for (const auto word : RecordShape<Record>::kWords) rule.words.push_back(std::move(record.*word));
  if constexpr (kHasTarget<Record>) rule.targetDomain = record.targetDomainId;
  return rule;
}

template <typename Record>
Record ToRecord(Rule rule, DomainId domain, const std::string& domainName) {
  Record record;
  record.line = rule.line;
  record.domainId = domain;
  record.domainName = domainName;
  record.grant = rule.decision == Decision::kGrant;
  for (std::size_t i = 0; i < RecordShape<Record>::kWords.size(); ++i) {
    record.*RecordShape<Record>::kWords[i] = std::move(rule.words[i]);
  }
  if constexpr (kHasTarget<Record>) record.targetDomainId = rule.targetDomain;
  return record;
}

}  // namespace StandIn
