#include "host/module/rule_table.h"

namespace StandIn {

namespace {

std::string Joined(const std::vector<std::string>& words) {
  std::size_t size = words.size();
  for (const std::string& word : words) size += word.size();
  std::string joined;
  joined.reserve(size);
  for (const std::string& word : words) {
    joined.append(word).push_back('\0');
  }
  return joined;
}

std::vector<std::string> Separated(std::string_view joined) {
  std::vector<std::string> words;
  while (!joined.empty()) {
    const std::size_t end = joined.find('\0');
    words.emplace_back(joined.substr(0, end));
    joined.remove_prefix(end + 1);
  }
  return words;
}

}  // namespace

std::optional<DomainId> RuleTable::Set(const Rule& rule) {
  std::string words = Joined(rule.words);
  Stored* const stored = table_.Find(words);
  if (stored == nullptr) {
    table_.Append({std::move(words), rule.line, rule.targetDomain, rule.decision});
    return std::nullopt;
  }
  const DomainId replaced = stored->targetDomain;
  stored->line = rule.line;
  stored->targetDomain = rule.targetDomain;
  stored->decision = rule.decision;
  return replaced;
}

bool RuleTable::Holds(const std::vector<std::string>& words) const {
  return table_.Find(Joined(words)) != nullptr;
}

std::size_t RuleTable::DropTarget(DomainId target) {
  return table_.EraseIf([target](const Stored& stored) { return stored.targetDomain == target; });
}

std::vector<Rule> RuleTable::Rules() const {
  std::vector<Rule> rules;
  rules.reserve(table_.Size());
  for (const Stored& stored : table_.Records()) {
    rules.push_back({stored.line, Separated(stored.words), stored.targetDomain, stored.decision});
  }
  return rules;
}

}  // namespace StandIn
