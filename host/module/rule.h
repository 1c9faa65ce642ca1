// Rules as the security module holds them, in one shape for all kinds.
#pragma once

#include <array>
#include <cstdint>
#include <string>

#include "host/module/few_words.h"

namespace StandIn {

// A slot number; the lowest free slot is given to a new domain.
using DomainId = std::uint32_t;
// A process id; 0 stands for a domain as a whole.
using WorldId = std::int32_t;
using LabelId = std::uint32_t;

// The kinds of rules that consist of words and a decision.
enum class RuleKind : std::uint8_t {
  kObjectAccess,     // object, access
  kCapability,       // capability
  kTransition,       // label, target domain, event
  kFileCreation,     // parent label, file label, file type
  kCapabilityParam,  // capability, parameter
  kSyscall,          // system call
  kUnixSocket,       // label, socket type
};
inline constexpr std::size_t kRuleKinds = 7;

// A rule kind's keyword in policy files and the number of its words, by RuleKind.
struct RuleKindInfo {
  const char* keyword;
  std::size_t words;
};
inline constexpr std::array<RuleKindInfo, kRuleKinds> kRuleKindInfo{{
    {"-a", 2},
    {"-c", 1},
    {"-d", 3},
    {"-f", 3},
    {"-p", 2},
    {"-s", 1},
    {"-u", 2},
}};
constexpr const RuleKindInfo& InfoOf(RuleKind kind) {
  return kRuleKindInfo[static_cast<std::size_t>(kind)];
}

enum class Decision : std::uint8_t { kRevoke, kGrant };

// One decision. The words are its key within a domain and kind.
struct Rule {
  std::uint32_t line = 0;     // in the policy file; 0 when there is none
  FewWords words;             // InfoOf(kind).words of them
  DomainId targetDomain = 0;  // of transitions only
  Decision decision = Decision::kRevoke;
};

// One decision on a path, for a domain as a whole (world 0) or for one of its worlds.
struct FileRule {
  WorldId world = 0;
  std::string path;              // absolute
  std::uint32_t permission = 0;  // bits of kPermissionBits
};

// The permission bits and their letters in policy files.
struct PermissionBit {
  std::uint32_t bit;
  char letter;
};
inline constexpr std::array<PermissionBit, 3> kPermissionBits{
    {{0x1, 'r'}, {0x2, 'w'}, {0x10, 'x'}}};

}  // namespace StandIn
