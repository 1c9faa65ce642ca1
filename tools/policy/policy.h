// What a policy means, as far as it can be compared and asked: a value, wherever it was read.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "host/module/rule.h"
#include "host/module/security_module.h"
#include "platform/rule_types.h"
#include "tools/policy/shared_name.h"

namespace SecPolicyTool {

// Where something stands. `line` and `column` count from 1; 0 when unknown.
struct Place {
  SharedName file;
  unsigned int line = 0;
  unsigned int column = 0;

  bool operator==(const Place&) const = default;
};

using ZekCtl::Security::kRuleTypes;
using ZekCtl::Security::RuleType;
using ZekCtl::Security::RuleTypeInfo;
using ZekCtl::Security::RuleWordInfo;
using ZekCtl::Security::TypeOfKeyword;

// What a domain's rule decides on: its key. The words are those of its RuleTypeInfo.
struct RuleKey {
  RuleType type = RuleType::kSyscall;
  StandIn::FewWords words;
  StandIn::WorldId world = 0;  // of path rules: the one world that it is for; 0 for the domain

  // The check takes the compiler's own comparison with 0 for a pointer's.
  auto operator<=>(const RuleKey&) const = default;  // NOLINT(modernize-use-nullptr)
};

struct PolicyRule {
  RuleKey key;
  bool isGranted = false;        // unless it is a path rule
  std::uint32_t permission = 0;  // of path rules: bits of StandIn::kPermissionBits
  std::optional<Place> place;

  // The same decision on the same thing, wherever it stands.
  [[nodiscard]] bool Means(const PolicyRule& other) const {
    return key == other.key && isGranted == other.isGranted && permission == other.permission;
  }
};

// "grant", "revoke", or the letters of a path rule's permission, which may be none.
std::string DecisionOf(const PolicyRule& rule);
// The rule as a line of a policy file; the world of a path rule, where there is one, as a comment.
std::string LineOf(const PolicyRule& rule);

struct DomainContent {
  // In the order of their types, and within one in the order in which they were first set.
  std::vector<PolicyRule> rules;
  std::optional<Place> place;  // of its file
};

struct ObjectContent {
  bool isPredefined = false;
  std::optional<Place> place;
};

struct LabelledFile {
  std::string label;  // empty when the kernel has no name for it any more
  std::optional<Place> place;
};

// The words that the host's kernel uses for tardisks, and what it labels files with.
struct HostWords {
  std::string launchDomain;
  std::string execEvent;
  std::string defaultTardiskLabel;
  std::string defaultTardiskDomain;
};

struct Policy {
  std::map<std::string, DomainContent> domains;
  std::map<std::string, ObjectContent> objects;
  // Paths within the host's root that carry another label than `default`, the tardisks aside.
  std::map<std::string, LabelledFile> files;
  // Names of the tardisks, without "/tardisks/", that do.
  std::map<std::string, LabelledFile> tardisks;
  HostWords words;
};

// The label that every file of a host carries from the start.
inline constexpr char kUnlabelled[] = "default";

// "FILE:LINE:COLUMN", without what is not known; "-" for nothing.
std::string PlaceText(const std::optional<Place>& place);

}  // namespace SecPolicyTool
