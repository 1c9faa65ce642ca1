#include "host/module/rule_check.h"

#include <array>
#include <cerrno>
#include <string_view>
#include <unordered_map>

#include "host/module/module_error.h"
#include "host/module/names.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

namespace {

// What judges one word of a rule: a list, or, where there is none, nothing but what it is called.
struct WordRule {
  std::optional<WordList> list;
  const char* title = nullptr;
};

constexpr WordRule kLabel{WordList::kObjects};
constexpr WordRule kTarget{std::nullopt, "target domain"};
constexpr WordRule kParameter{std::nullopt, "parameter"};

// By RuleKind; InfoOf(kind).words of them count.
constexpr std::array<std::array<WordRule, 3>, kRuleKinds> kWordRules{{
    {{kLabel, {WordList::kObjectAccesses}}},
    {{{WordList::kCapabilities}}},
    {{kLabel, kTarget, {WordList::kTransitionEvents}}},
    {{kLabel, kLabel, {WordList::kFileTypes}}},
    {{{WordList::kParamCapabilities}, kParameter}},
    {{{WordList::kSyscalls}}},
    {{kLabel, {WordList::kSocketTypes}}},
}};

void CheckWordCount(RuleKind kind, const Rule& rule) {
  const auto& [keyword, count] = InfoOf(kind);
  if (rule.words.size() != count) {
    throw ModuleError(EINVAL,
                      StrCat("a rule \"", keyword, "\" has ", count,
                             count == 1 ? " word, not " : " words, not ", rule.words.size()));
  }
}

}  // namespace

void CheckRuleWords(RuleKind kind, const Rule& rule,
                    const std::function<void(WordList, const std::string&)>& validate) {
  CheckWordCount(kind, rule);
  const auto& wordRules = kWordRules[static_cast<std::size_t>(kind)];
  for (std::size_t i = 0; i < rule.words.size(); ++i) {
    if (wordRules[i].list) {
      validate(*wordRules[i].list, rule.words[i]);
    } else {
      RequireFreeWord(wordRules[i].title, rule.words[i]);
    }
  }
}

void CheckCapabilityContradictions(const std::string& domainName, const std::vector<Rule>& rules) {
  std::unordered_map<std::string_view, std::unordered_map<std::string_view, const Rule*>> first;
  for (const Rule& rule : rules) {
    CheckWordCount(RuleKind::kCapabilityParam, rule);
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
