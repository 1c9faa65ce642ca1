// The arguments of operations in the words of policy files.
#pragma once

#include <string>
#include <vector>

#include "host/module/security_module.h"

namespace StandIn {

// The domain's name, or "#" and its id when no domain has it.
std::string DomainWord(SecurityModule& module, DomainId domain);

// "domain" or "object".
std::string LabelTypeWord(LabelType type);

// The list's short name, for example "syscall".
std::string WordListWord(WordList list);

// The rule as a policy line: keyword, words, decision; then as a comment what a line does not show.
std::string RuleWords(RuleType type, const Rule& rule);

// The letters of the permission bits, in the order "rwx"; then "+" and the
// bits without a letter as a number.
std::string PermissionWord(std::uint32_t permission);

// The rule as a policy line; the world, where there is one, as a comment.
std::string FileRuleWords(const FileRule& rule);

std::string Join(const std::vector<std::string>& words);

}  // namespace StandIn
