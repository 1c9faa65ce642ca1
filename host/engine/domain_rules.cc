#include "host/engine/domain_rules.h"

#include <algorithm>

#include "host/engine/paths.h"

namespace StandIn {

void DomainRules::Add(RuleType type, std::vector<std::string> words, const NumberedRule& rule) {
  if (type == RuleType::kPath) words.at(0) = NormalPath(words.at(0));
  const auto [entry, isNew] = byWords_.insert_or_assign(Key(type, std::move(words)), rule);
  if (!isNew) return;
  const std::vector<std::string>& kept = entry->first.second;
  if (type == RuleType::kTransition) {
    transitions_[{kept.at(0), kept.at(2)}].push_back({&entry->second, &kept.at(1)});
  } else if (type == RuleType::kFileCreation) {
    creations_[{kept.at(0), kept.at(2)}].push_back({&entry->second, &kept.at(1)});
  }
}

const NumberedRule* DomainRules::Find(RuleType type, const std::vector<std::string>& words) const {
  const auto found = byWords_.find({type, words});
  return found == byWords_.end() ? nullptr : &found->second;
}

const NumberedRule* DomainRules::FindForPath(const std::string& path) const {
  std::vector<std::string> paths = WithParents(NormalPath(path));
  for (; !paths.empty(); paths.pop_back()) {
    if (const NumberedRule* const rule = Find(RuleType::kPath, {paths.back()})) return rule;
  }
  return nullptr;
}

RuleWithResult DomainRules::FindTransition(const std::string& label,
                                           const std::string& event) const {
  return FirstOf(transitions_, label, event);
}

RuleWithResult DomainRules::FindCreation(const std::string& parentLabel,
                                         const std::string& fileType) const {
  return FirstOf(creations_, parentLabel, fileType);
}

RuleWithResult DomainRules::FirstOf(const Groups& groups, const std::string& label,
                                    const std::string& word) {
  const auto found = groups.find({label, word});
  if (found == groups.end()) return {};
  const auto granted =
      std::find_if(found->second.begin(), found->second.end(),
                   [](const RuleWithResult& each) { return each.rule->isGranted; });
  return granted == found->second.end() ? found->second.front() : *granted;
}

}  // namespace StandIn
