// The kinds of findings: their ids, which are stable, and what they mean.
#pragma once

#include <array>
#include <cstdint>
#include <string>

#include "tools/check/finding.h"

namespace SecPolicyTool {

// In the order of FindingKinds().
enum class Kind : std::uint8_t {
  kBadDecision,
  kBadPermission,
  kContradictoryParameter,
  kLabelRefused,
  kLoadError,
  kMissingDomain,
  kNoBackingTardisk,
  kRefusedName,
  kSecondException,
  kTreePattern,
  kUnknownDomain,
  kUnknownRuleType,
  kUnknownWord,
  kUnreadable,
  kWordCount,

  kBackupFile,
  kCarriageReturn,
  kContradictoryRule,
  kDuplicateTardiskPolicy,
  kEmptyDomain,
  kLongLine,
  kMissingPath,
  kNulByte,
  kOverriddenLabel,
  kRelativePath,
  kRepeatedRule,
  kRootLabel,
  kSkippedEntry,
  kTab,
  kUndefinedTardiskLabel,
  kUnlabelledFile,
  kUnreachableDomain,
  kUnusedObject,
};
inline constexpr std::size_t kFindingKinds = 33;

struct FindingKind {
  const char* id;
  // A finding of a kind that is a warning is an error all the same where a load reports it.
  Severity severity;
  const char* title;  // what it is, in a sentence
  const char* help;   // what to do, in a sentence
};

// All kinds: errors, then warnings, each in the order of their ids.
const std::array<FindingKind, kFindingKinds>& FindingKinds();
const FindingKind& InfoOf(Kind kind);

// Whether a kind of that id is a warning.
bool IsWarningId(const std::string& id);
// Their ids, in order, separated by ", ".
std::string WarningIds();

}  // namespace SecPolicyTool
