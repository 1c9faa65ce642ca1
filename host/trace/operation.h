// The kernel operations, as they are traced, refused on demand and kept.
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace StandIn {

enum class Operation : std::uint8_t {
  kOpenInterface,
  kCloseInterface,
  kFindDomain,
  kCreateDomain,
  kDestroyDomain,
  kDomainName,
  kDomainInfo,
  kMaxDomains,
  kLeakedDomains,
  kSetGlobalVMDomain,
  kSetIoFilterDomain,
  kAddService,
  kWorldDomain,
  kPlaceWorld,
  kValidateWord,
  kWords,
  kSetRule,
  kGetRules,
  kCheckCapabilityParams,
  kInvalidLabels,
  kAddLabels,
  kRemoveLabels,
  kPredefinedLabel,
  kPrivilegedVm,
  kLookupLabel,
  kLabelName,
  kAddFileRules,
  kRemoveFileRule,
  kUpdateFileRule,
  kReplacePath,
  kCountFileRules,
  kReadFileRules,
  kSetFileLabel,
  kGetFileLabel,
  kTardiskLaunchDomain,
  kTardiskExecEvent,
  kDefaultTardiskLabel,
  kDefaultTardiskDomain,
  kResolvePath,
  kBackingTardisk,
};

// What an operation has to do with the state that the module holds.
enum class Effect : std::uint8_t { kNone, kReads, kChanges };

struct OperationInfo {
  std::string_view name;  // in traces and on command lines
  Effect effect;
};

// By Operation.
inline constexpr std::array<OperationInfo, 40> kOperations{{
    {"open-interface", Effect::kNone},
    {"close-interface", Effect::kNone},
    {"find-domain", Effect::kReads},
    {"create-domain", Effect::kChanges},
    {"destroy-domain", Effect::kChanges},
    {"domain-name", Effect::kReads},
    {"domain-info", Effect::kReads},
    {"max-domains", Effect::kNone},
    {"leaked-domains", Effect::kReads},
    {"set-global-vm-domain", Effect::kChanges},
    {"set-io-filter-domain", Effect::kChanges},
    {"add-service", Effect::kChanges},
    {"world-domain", Effect::kReads},
    {"place-world", Effect::kChanges},
    {"validate-word", Effect::kReads},
    {"words", Effect::kReads},
    {"set-rule", Effect::kChanges},
    {"get-rules", Effect::kReads},
    {"check-capability-params", Effect::kNone},
    {"invalid-labels", Effect::kReads},
    {"add-labels", Effect::kChanges},
    {"remove-labels", Effect::kChanges},
    {"predefined-label", Effect::kNone},
    {"privileged-vm", Effect::kNone},
    {"lookup-label", Effect::kReads},
    {"label-name", Effect::kReads},
    {"add-file-rules", Effect::kChanges},
    {"remove-file-rule", Effect::kChanges},
    {"update-file-rule", Effect::kChanges},
    {"replace-path", Effect::kChanges},
    {"count-file-rules", Effect::kReads},
    {"read-file-rules", Effect::kReads},
    {"set-file-label", Effect::kChanges},
    {"get-file-label", Effect::kReads},
    {"tardisk-launch-domain", Effect::kNone},
    {"tardisk-exec-event", Effect::kNone},
    {"default-tardisk-label", Effect::kNone},
    {"default-tardisk-domain", Effect::kNone},
    {"resolve-path", Effect::kNone},
    {"backing-tardisk", Effect::kNone},
}};
static_assert(kOperations.size() == static_cast<std::size_t>(Operation::kBackingTardisk) + 1);

constexpr const OperationInfo& InfoOf(Operation operation) {
  return kOperations[static_cast<std::size_t>(operation)];
}

// The operation of that name; nothing when there is none.
constexpr std::optional<Operation> FindOperation(std::string_view name) {
  for (std::size_t i = 0; i < kOperations.size(); ++i) {
    if (kOperations[i].name == name) return static_cast<Operation>(i);
  }
  return std::nullopt;
}

}  // namespace StandIn
