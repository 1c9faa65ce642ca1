// Rules as the security module holds them, in one shape for all kinds.
#pragma once

#include <array>
#include <cstdint>
#include <string>

#include "host/module/few_words.h"
#include "platform/rule_types.h"

namespace StandIn {

// A slot number; the lowest free slot is given to a new domain.
using DomainId = std::uint32_t;
// A process id; 0 stands for a domain as a whole.
using WorldId = std::int32_t;
using LabelId = std::uint32_t;

using ZekCtl::Security::RuleType;

enum class Decision : std::uint8_t { kRevoke, kGrant };

// One decision of a rule that ends in one. The words are its key within a domain and type.
struct Rule {
  std::uint32_t line = 0;     // in the policy file; 0 when there is none
  FewWords words;             // as many as InfoOf(type) says
  DomainId targetDomain = 0;  // of types with a DomainWord() only: its id
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
