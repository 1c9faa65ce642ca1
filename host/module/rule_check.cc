#include "host/module/rule_check.h"

#include <cerrno>
#include <string_view>
#include <unordered_map>

#include "host/module/module_error.h"
#include "host/module/names.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;
using ZekCtl::Security::RuleTypeInfo;
using ZekCtl::Security::RuleWordInfo;

namespace {

void CheckWordCount(RuleType type, const Rule& rule) {
  const RuleTypeInfo& info = InfoOf(type);
  if (rule.words.size() != info.wordCount) {
    throw ModuleError(
        EINVAL, StrCat("a rule \"", info.keyword, "\" has ", info.wordCount,
                       info.wordCount == 1 ? " word, not " : " words, not ", rule.words.size()));
  }
}

}  // namespace

void CheckRuleWords(RuleType type, const Rule& rule,
                    const std::function<void(WordList, const std::string&)>& validate) {
  CheckWordCount(type, rule);
  std::size_t i = 0;
  for (const RuleWordInfo& info : InfoOf(type).Words()) {
    const std::string& word = rule.words[i++];
    if (info.list) {
      validate(ToModule(*info.list), word);
    } else {
      RequireFreeWord(info.name, word);
    }
  }
}

void CheckCapabilityContradictions(const std::string& domainName, const std::vector<Rule>& rules) {
  std::unordered_map<std::string_view, std::unordered_map<std::string_view, const Rule*>> first;
  for (const Rule& rule : rules) {
    CheckWordCount(RuleType::kCapabilityParam, rule);
    const Rule* const earlier = first[rule.words[0]].emplace(rule.words[1], &rule).first->second;
    if (earlier->decision == rule.decision) {
      continue;
    }
    const bool grantedFirst = earlier->decision == Decision::kGrant;
    throw ModuleError(
        EINVAL, StrCat("the capability \"", rule.words[0], "\" with the parameter \"",
                       rule.words[1], "\" of the domain \"", domainName, "\" is ",
                       grantedFirst ? "granted" : "revoked", " on line ", earlier->line, " and ",
                       grantedFirst ? "revoked" : "granted", " on line ", rule.line));
  }
}

}  // namespace StandIn
