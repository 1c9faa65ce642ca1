#include "tools/policy/policy.h"

#include <algorithm>

#include "host/module/permission_letters.h"

namespace SecPolicyTool {

using StandIn::RuleKind;
using StandIn::WordList;

const std::array<RuleTypeInfo, 8>& RuleTypes() {
  static const std::array<RuleTypeInfo, 8> kTypes{{
      {"-a",
       "object access",
       RuleKind::kObjectAccess,
       {{"object", WordList::kObjects}, {"access", WordList::kObjectAccesses}}},
      {"-c", "capability", RuleKind::kCapability, {{"capability", WordList::kCapabilities}}},
      {"-d",
       "transition",
       RuleKind::kTransition,
       {{"label", WordList::kObjects},
        {"target domain", std::nullopt},
        {"event", WordList::kTransitionEvents}}},
      {"-f",
       "file creation",
       RuleKind::kFileCreation,
       {{"parent label", WordList::kObjects},
        {"file label", WordList::kObjects},
        {"file type", WordList::kFileTypes}}},
      {"-p",
       "capability parameter",
       RuleKind::kCapabilityParam,
       {{"capability", WordList::kParamCapabilities}, {"parameter", std::nullopt}}},
      {"-r", "path", std::nullopt, {{"path", std::nullopt}}},
      {"-s", "system call", RuleKind::kSyscall, {{"system call", WordList::kSyscalls}}},
      {"-u",
       "socket creation",
       RuleKind::kUnixSocket,
       {{"label", WordList::kObjects}, {"socket type", WordList::kSocketTypes}}},
  }};
  return kTypes;
}

const RuleTypeInfo& InfoOf(RuleType type) { return RuleTypes().at(static_cast<std::size_t>(type)); }

namespace {

template <typename Predicate>
std::optional<RuleType> FindType(const Predicate& matches) {
  const auto& types = RuleTypes();
  const auto found = std::find_if(types.begin(), types.end(), matches);
  if (found == types.end()) return std::nullopt;
  return static_cast<RuleType>(found - types.begin());
}

}  // namespace

RuleType TypeOf(RuleKind kind) {
  return *FindType([&](const RuleTypeInfo& info) { return info.kind == kind; });
}

std::optional<RuleType> TypeOfKeyword(const std::string& keyword) {
  return FindType([&](const RuleTypeInfo& info) { return info.keyword == keyword; });
}

std::string DecisionOf(const PolicyRule& rule) {
  if (rule.key.type == RuleType::kPath) return StandIn::PermissionLetters(rule.permission);
  return rule.isGranted ? "grant" : "revoke";
}

std::string LineOf(const PolicyRule& rule) {
  std::string line = InfoOf(rule.key.type).keyword;
  for (const std::string& word : rule.key.words) line += " " + word;
  const std::string decision = DecisionOf(rule);
  if (!decision.empty()) line += " " + decision;
  if (rule.key.world != 0) line += " # world " + std::to_string(rule.key.world);
  return line;
}

std::string PlaceText(const std::optional<Place>& place) {
  if (!place) return "-";
  std::string text = place->file;
  for (const unsigned int number : {place->line, place->column}) {
    if (number == 0) break;
    text += (text.empty() ? "line " : ":") + std::to_string(number);
  }
  return text;
}

}  // namespace SecPolicyTool
