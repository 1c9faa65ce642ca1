#include "host/module/rule_table.h"

#include <limits>
#include <stdexcept>
#include <utility>

namespace StandIn {

namespace {

// From how many dropped rules on it is worth while to make room.
constexpr std::size_t kManyDropped = 1024;

void AppendWords(std::string& text, const FewWords& words) {
  for (const std::string& word : words) text.append(word).push_back('\0');
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
  if (decided_.size() > 2 * index_.size() + kManyDropped) Compact();
  const std::size_t text = text_.size();
  const std::size_t places = decided_.size();
  try {
    AppendWords(text_, rule.words);
    return SetLastWords(text, rule);
  } catch (...) {
    decided_.resize(places);
    text_.resize(text);
    throw;
  }
}

// Decides on the words that stand at the end of text_, from `text` on.
std::optional<DomainId> RuleTable::SetLastWords(std::size_t text, const Rule& rule) {
  const std::string_view words = std::string_view(text_).substr(text);
  if (const auto found = index_.find(words); found != index_.end()) {
    text_.resize(text);
    Decided& decided = decided_[*found];
    decided.line = rule.line;
    decided.decision = rule.decision;
    return std::exchange(decided.target, rule.targetDomain);
  }
  if (decided_.size() > std::numeric_limits<Place>::max() ||
      words.size() > std::numeric_limits<std::uint32_t>::max()) {
    throw std::length_error("a table of rules is full");
  }
  const auto place = static_cast<Place>(decided_.size());
  decided_.push_back({text, static_cast<std::uint32_t>(words.size()), rule.line, rule.targetDomain,
                      rule.decision});
  index_.insert(place);
  return std::nullopt;
}

bool RuleTable::Holds(const FewWords& words) const {
  std::string joined;
  AppendWords(joined, words);
  return index_.contains(std::string_view(joined));
}

void RuleTable::DropTarget(DomainId target) {
  for (Place place = 0; place < decided_.size(); ++place) {
    Decided& decided = decided_[place];
    if (!decided.isHeld || decided.target != target) continue;
    index_.erase(WordsAt(place));
    decided.isHeld = false;
  }
}

std::vector<Rule> RuleTable::Rules() const {
  std::vector<Rule> rules;
  rules.reserve(Size());
  ForEach([&rules](Rule rule) { rules.push_back(std::move(rule)); });
  return rules;
}

Rule RuleTable::RuleOf(const Decided& decided) const {
  const std::string_view words = std::string_view(text_).substr(decided.text, decided.size);
  return {decided.line, Separated(words), decided.target, decided.decision};
}

// Gives back the room of what was dropped.
void RuleTable::Compact() {
  std::string text;
  std::vector<Decided> held;
  held.reserve(Size());
  for (const Decided& decided : decided_) {
    if (!decided.isHeld) continue;
    held.push_back(decided);
    held.back().text = text.size();
    text.append(text_, decided.text, decided.size);
  }
  // From here on nothing throws: the index has had room for as many.
  text_ = std::move(text);
  decided_ = std::move(held);
  index_.clear();
  for (Place place = 0; place < decided_.size(); ++place) index_.insert(place);
}

}  // namespace StandIn
