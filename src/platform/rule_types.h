// The types of rules in domain files: the one description that everything follows which parses,
// stores, checks, prints or searches rules.
//
// A new type is a record and its operations in zek_access.h, and an enumerator and a row here.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <list>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <tuple>

#include "zek_access.h"

namespace ZekCtl::Security {

// The types, in the byte order of their keywords. Rules are checked, set and printed in this order.
enum class RuleType : std::uint8_t {
  kObjectAccess,     // "-a", ZekAccess_ObjectAccessRule
  kCapability,       // "-c", ZekAccess_CapabilityRule
  kTransition,       // "-d", ZekAccess_DomTransRule
  kFileCreation,     // "-f", ZekAccess_FileCreationRule
  kCapabilityParam,  // "-p", ZekAccess_CapabilityParamRule
  kPath,             // "-r", ZekAccess_FilePathAccessRule
  kSyscall,          // "-s", ZekAccess_SyscallRule
  kUnixSocket,       // "-u", ZekAccess_UnixSockCreationRule
};

// The number of words between the keyword and the decision is at most this.
inline constexpr std::size_t kMostRuleWords = 3;

// One word of a rule's line, without its record.
struct RuleWordInfo {
  const char* name = nullptr;  // in messages: "file type"
  // The list that must contain the word; none for a free word and for the name of a domain.
  std::optional<ZekAccess_KeywordType> list;
  // The word's position in a question about the rule. At position 0 it is the operation itself.
  std::size_t questionPosition = 0;
  const char* questionWord = nullptr;  // what stands for it in the form of a question: "TYPE"
  bool isDomain = false;               // the name of an existing domain
};

// What a rule's line ends in.
enum class RuleEnding : std::uint8_t {
  kDecision,    // "grant" or "revoke"
  kPermission,  // letters of "rwx", or nothing at all
};

// A rule type, without its record.
struct RuleTypeInfo {
  RuleType type{};                  // its enumerator
  const char* keyword = nullptr;    // in policy files: "-s"
  const char* name = nullptr;       // in messages: "system call"
  const char* shortName = nullptr;  // on the command line: "syscall"
  // The first word of questions about such rules. None where it is one of the rule's own words, and
  // for paths.
  const char* operation = nullptr;
  RuleEnding ending = RuleEnding::kDecision;             // what follows the words
  std::array<RuleWordInfo, kMostRuleWords> wordSlots{};  // the first wordCount are in use
  std::size_t wordCount = 0;                             // of the words in use

  // The words between the keyword and the decision or permission, in the order of the line.
  [[nodiscard]] constexpr std::span<const RuleWordInfo> Words() const {
    return std::span(wordSlots).first(wordCount);
  }
  // Whether the rule ends in "grant" or "revoke".
  [[nodiscard]] constexpr bool HasDecision() const { return ending == RuleEnding::kDecision; }
  // The position of the word that names a domain; none for most types.
  [[nodiscard]] constexpr std::optional<std::size_t> DomainWord() const {
    for (std::size_t i = 0; i < wordCount; ++i) {
      if (wordSlots[i].isDomain) return i;
    }
    return std::nullopt;
  }
};

// One word of a rule's line, and where the record keeps it.
template <typename Record>
struct RuleWord {
  std::string Record::*field = nullptr;  // nullptr: there is no such word
  RuleWordInfo info{};                   // the word without its record
  // Of a word that names a domain: where the record keeps that domain's id.
  std::uint32_t Record::*domainId = nullptr;
};

// A rule type with its record.
template <typename Record>
struct RuleRow {
  RuleTypeInfo info;  // but for the words, which RuleInfo adds
  // In the order of the line.
  std::array<RuleWord<Record>, kMostRuleWords> words{};
  // Installs a rule; nullptr for rules that are installed by a private call.
  void (ZekAccessInterfaceImpl::*set)(Record) = nullptr;
  // Appends the rules that the kernel holds for a domain.
  void (ZekAccessInterfaceImpl::*get)(unsigned int, std::list<Record>&) = nullptr;

  // The words that there are.
  [[nodiscard]] constexpr std::span<const RuleWord<Record>> Words() const {
    std::size_t count = 0;
    while (count < words.size() && words[count].field != nullptr) ++count;
    return std::span(words).first(count);
  }
};

// All types, by RuleType.
inline constexpr std::tuple kRuleRows{
    RuleRow<ZekAccess_ObjectAccessRule>{
        {RuleType::kObjectAccess, "-a", "object access", "access"},
        {{{&ZekAccess_ObjectAccessRule::object, {"object", kObjectKeyword, 1, "LABEL"}},
          {&ZekAccess_ObjectAccessRule::access, {"access", kObjectAccessKeyword, 0, "ACCESS"}}}},
        &ZekAccessInterfaceImpl::SetObjectAccessRule,
        &ZekAccessInterfaceImpl::GetObjectAccessRules},
    RuleRow<ZekAccess_CapabilityRule>{
        {RuleType::kCapability, "-c", "capability", "capability", "capability"},
        {{{&ZekAccess_CapabilityRule::capability, {"capability", kCapabilityKeyword, 1, "NAME"}}}},
        &ZekAccessInterfaceImpl::SetCapabilityRule,
        &ZekAccessInterfaceImpl::GetCapabilityRules},
    RuleRow<ZekAccess_DomTransRule>{
        {RuleType::kTransition, "-d", "transition", "transition", "transition"},
        {{{&ZekAccess_DomTransRule::label, {"label", kObjectKeyword, 2, "LABEL"}},
          {&ZekAccess_DomTransRule::targetDomain,
           {"target domain", std::nullopt, 3, "TARGET", true},
           &ZekAccess_DomTransRule::targetDomainId},
          {&ZekAccess_DomTransRule::transition, {"event", kTransitionKeyword, 1, "EVENT"}}}},
        &ZekAccessInterfaceImpl::SetDomTransRule,
        &ZekAccessInterfaceImpl::GetDomTransRules},
    RuleRow<ZekAccess_FileCreationRule>{
        {RuleType::kFileCreation, "-f", "file creation", "create", "create"},
        {{{&ZekAccess_FileCreationRule::parentLabel, {"parent label", kObjectKeyword, 2, "PARENT"}},
          {&ZekAccess_FileCreationRule::fileLabel, {"file label", kObjectKeyword, 3, "LABEL"}},
          {&ZekAccess_FileCreationRule::fileType, {"file type", kFileTypeKeyword, 1, "TYPE"}}}},
        &ZekAccessInterfaceImpl::SetFileCreationRule,
        &ZekAccessInterfaceImpl::GetFileCreationRules},
    RuleRow<ZekAccess_CapabilityParamRule>{
        {RuleType::kCapabilityParam, "-p", "capability parameter", "param", "capability"},
        {{{&ZekAccess_CapabilityParamRule::capability,
           {"capability", kCapabilityParamKeyword, 1, "NAME"}},
          {&ZekAccess_CapabilityParamRule::parameter, {"parameter", std::nullopt, 2, "PARAM"}}}},
        &ZekAccessInterfaceImpl::SetCapabilityParamRule,
        &ZekAccessInterfaceImpl::GetCapabilityParamRules},
    RuleRow<ZekAccess_FilePathAccessRule>{
        {RuleType::kPath, "-r", "path", "path", nullptr, RuleEnding::kPermission},
        {{{&ZekAccess_FilePathAccessRule::path, {"path", std::nullopt, 1, "PATH"}}}},
        nullptr,
        &ZekAccessInterfaceImpl::GetFilePathAccessRules},
    RuleRow<ZekAccess_SyscallRule>{
        {RuleType::kSyscall, "-s", "system call", "syscall", "syscall"},
        {{{&ZekAccess_SyscallRule::syscall, {"system call", kSyscallKeyword, 1, "NAME"}}}},
        &ZekAccessInterfaceImpl::SetSyscallRule,
        &ZekAccessInterfaceImpl::GetSyscallRules},
    RuleRow<ZekAccess_UnixSockCreationRule>{
        {RuleType::kUnixSocket, "-u", "socket creation", "socket", "socket"},
        {{{&ZekAccess_UnixSockCreationRule::label, {"label", kObjectKeyword, 2, "LABEL"}},
          {&ZekAccess_UnixSockCreationRule::sockType,
           {"socket type", kSockTypeKeyword, 1, "TYPE"}}}},
        &ZekAccessInterfaceImpl::SetUnixSockCreationRule,
        &ZekAccessInterfaceImpl::GetUnixSockCreationRules},
};

// The row of a record's type.
template <typename Record>
inline constexpr const RuleRow<Record>& kRuleRow = std::get<RuleRow<Record>>(kRuleRows);

// The row's type without its record.
template <typename Record>
constexpr RuleTypeInfo RuleInfo(const RuleRow<Record>& row) {
  RuleTypeInfo info = row.info;
  for (const RuleWord<Record>& word : row.Words()) info.wordSlots[info.wordCount++] = word.info;
  return info;
}

// The entries of all rows, in their order.
constexpr std::array<RuleTypeInfo, std::tuple_size_v<decltype(kRuleRows)>> RuleInfos() {
  return std::apply([](const auto&... rows) { return std::array{RuleInfo(rows)...}; }, kRuleRows);
}

// All types without their records, by RuleType.
inline constexpr auto kRuleTypes = RuleInfos();

// The entry of a type, which must be one of the enumerators.
constexpr const RuleTypeInfo& InfoOf(RuleType type) {
  return kRuleTypes[static_cast<std::size_t>(type)];
}

// The type with that keyword; none for another word.
constexpr std::optional<RuleType> TypeOfKeyword(std::string_view keyword) {
  for (const RuleTypeInfo& info : kRuleTypes) {
    if (keyword == info.keyword) return info.type;
  }
  return std::nullopt;
}

// Whether the entries stand at the places of their enumerators, in the byte order of their
// keywords.
constexpr bool AreInOrder(std::span<const RuleTypeInfo> types) {
  bool isInOrder = true;
  for (std::size_t i = 0; i < types.size(); ++i) {
    isInOrder &= types[i].type == static_cast<RuleType>(i);
    isInOrder &= i == 0 || std::string_view(types[i - 1].keyword) < types[i].keyword;
  }
  return isInOrder;
}
static_assert(AreInOrder(kRuleTypes));

}  // namespace ZekCtl::Security
