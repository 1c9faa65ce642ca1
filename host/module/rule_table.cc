#include "host/module/rule_table.h"

#include <algorithm>
#include <string_view>

namespace StandIn {

namespace {

std::string Joined(const FewWords& words) {
  std::size_t size = words.size();
  for (const std::string& word : words) size += word.size();
  std::string joined;
  joined.reserve(size);
  for (const std::string& word : words) {
    joined.append(word).push_back('\0');
  }
  return joined;
}

FewWords Separated(std::string_view joined) {
  FewWords words;
  while (!joined.empty()) {
    const std::size_t end = joined.find('\0');
    words.push_back(std::string(joined.substr(0, end)));
    joined.remove_prefix(end + 1);
  }
  return words;
}

}  // namespace

std::optional<DomainId> RuleTable::Set(const Rule& rule) {
  const auto [entry, isNew] = decided_.try_emplace(
      Joined(rule.words), Decided{next_, rule.line, rule.targetDomain, rule.decision});
  if (isNew) {
    ++next_;
    return std::nullopt;
  }
  Decided& decided = entry->second;
  const DomainId replaced = decided.targetDomain;
  decided = {decided.place, rule.line, rule.targetDomain, rule.decision};
  return replaced;
}

bool RuleTable::Holds(const FewWords& words) const { return decided_.contains(Joined(words)); }

std::size_t RuleTable::DropTarget(DomainId target) {
  return std::erase_if(decided_,
                       [target](const auto& entry) { return entry.second.targetDomain == target; });
}

std::vector<Rule> RuleTable::Rules() const {
  using Entry = decltype(decided_)::value_type;
  std::vector<const Entry*> entries;
  entries.reserve(decided_.size());
  for (const Entry& entry : decided_) entries.push_back(&entry);
  std::sort(entries.begin(), entries.end(),
            [](const Entry* a, const Entry* b) { return a->second.place < b->second.place; });

  std::vector<Rule> rules;
  rules.reserve(entries.size());
  for (const auto* entry : entries) {
    const auto& [words, decided] = *entry;
    rules.push_back({decided.line, Separated(words), decided.targetDomain, decided.decision});
  }
  return rules;
}

}  // namespace StandIn
