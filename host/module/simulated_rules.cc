// The operations of the simulated module on words and on rules that consist of words.
#include <cerrno>

#include "host/module/module_error.h"
#include "host/module/rule_check.h"
#include "host/module/simulated_module.h"
#include "host/module/word_lists.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

namespace {

void RequireList(WordList list) {
  if (InfoOf(list) == nullptr) {
    throw ModuleError(EINVAL, StrCat("no word list has the number ", static_cast<unsigned>(list)));
  }
}

void RequireDecision(RuleType type) {
  if (static_cast<std::size_t>(type) >= ZekCtl::Security::kRuleTypes.size()) {
    throw ModuleError(EINVAL,
                      StrCat("no kind of rules has the number ", static_cast<unsigned>(type)));
  }
  if (!InfoOf(type).HasDecision()) {
    throw ModuleError(EINVAL, StrCat("a rule \"", InfoOf(type).keyword, "\" has no decision"));
  }
}

}  // namespace

void SimulatedModule::ValidateWord(WordList list, const std::string& word) {
  RequireList(list);
  if (list == WordList::kObjects) {
    if (const LabelTable& objects = Labels(LabelType::kObject); !objects.Defines(word)) {
      throw ModuleError(EINVAL, UnknownWordText(list, word, objects.Names()));
    }
    return;
  }
  if (!WordsOf(list).contains(word)) {
    const auto words = description_.words.find(list);
    throw ModuleError(EINVAL,
                      UnknownWordText(list, word,
                                      words == description_.words.end() ? std::vector<std::string>()
                                                                        : words->second));
  }
}

std::map<std::string, long> SimulatedModule::Words(WordList list) {
  RequireList(list);
  if (list == WordList::kObjects) return Labels(LabelType::kObject).Ids();
  return {WordsOf(list).begin(), WordsOf(list).end()};
}

void SimulatedModule::SetRule(RuleType type, DomainId domain, const Rule& rule) {
  RequireDecision(type);
  state_->domains.Require(domain);
  CheckRuleWords(type, rule,
                 [this](WordList list, const std::string& word) { ValidateWord(list, word); });
  if (InfoOf(type).DomainWord()) state_->domains.Require(rule.targetDomain);
  state_->rules.Set(type, domain, rule);
}

std::vector<Rule> SimulatedModule::Rules(RuleType type, DomainId domain) {
  RequireDecision(type);
  state_->domains.Require(domain);
  return state_->rules.Rules(type, domain);
}

void SimulatedModule::CheckCapabilityParams(const std::string& domainName,
                                            const std::vector<Rule>& rules) {
  CheckCapabilityContradictions(domainName, rules);
}

}  // namespace StandIn
