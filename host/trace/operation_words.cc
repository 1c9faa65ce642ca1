#include "host/trace/operation_words.h"

#include <array>

#include "host/module/permission_letters.h"

namespace StandIn {

std::string DomainWord(SecurityModule& module, DomainId domain) {
  const auto info = module.GetDomainInfo(domain);
  return info ? info->name : "#" + std::to_string(domain);
}

std::string LabelTypeWord(LabelType type) {
  return type == LabelType::kDomain ? "domain" : "object";
}

std::string WordListWord(WordList list) {
  static constexpr std::array kNames{"object", "capability", "capability-param", "access",
                                     "event",  "file-type",  "socket-type",      "syscall"};
  const auto index = static_cast<std::size_t>(list) - 1;
  return index < kNames.size() ? kNames[index] : "list-" + std::to_string(index + 1);
}

std::string RuleWords(RuleType type, const Rule& rule) {
  std::string text =
      std::string(InfoOf(type).keyword) + " " + Join({rule.words.begin(), rule.words.end()});
  text += rule.decision == Decision::kGrant ? " grant" : " revoke";
  std::string comment;
  if (rule.line != 0) comment += " line " + std::to_string(rule.line);
  if (InfoOf(type).DomainWord()) comment += " into " + std::to_string(rule.targetDomain);
  return comment.empty() ? text : text + " #" + comment;
}

std::string PermissionWord(std::uint32_t permission) {
  std::uint32_t known = 0;
  for (const PermissionBit& permissionBit : kPermissionBits) known |= permissionBit.bit;
  std::string word = PermissionLetters(permission & known);
  if ((permission & ~known) != 0) word += "+" + std::to_string(permission & ~known);
  return word;
}

std::string FileRuleWords(const FileRule& rule) {
  const std::string text = "-r " + rule.path + " " + PermissionWord(rule.permission);
  return rule.world == 0 ? text : text + " # world " + std::to_string(rule.world);
}

std::string Join(const std::vector<std::string>& words) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : " ") + word;
  return text;
}

}  // namespace StandIn
