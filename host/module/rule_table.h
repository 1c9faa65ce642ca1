// The rules of one domain and type.
#pragma once

#include <tsl/robin_set.h>

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "host/module/rule.h"

namespace StandIn {

// One decision for each sequence of words, in the order in which their words were first set.
// Finding and setting take constant time. A million rules of ordinary words take about 100 MB.
class RuleTable {
 public:
  RuleTable() : index_(kNoBuckets, HashOfWords{this}, SameWords{this}) {}
  RuleTable(const RuleTable&) = delete;  // the index knows where the table is
  RuleTable& operator=(const RuleTable&) = delete;

  // A later decision on the same words takes the earlier one's place, whose target is given back.
  // The words must hold no NUL. What throws changes nothing.
  std::optional<DomainId> Set(const Rule& rule);
  [[nodiscard]] bool Holds(const FewWords& words) const;
  // Drops the rules with this target. Walks the whole table. Throws nothing.
  void DropTarget(DomainId target);

  // Hands the target of each rule to `visit`.
  template <typename Visit>
  void ForEachTarget(Visit visit) const {
    for (const Decided& decided : decided_) {
      if (decided.isHeld) visit(decided.target);
    }
  }

  [[nodiscard]] std::size_t Size() const { return index_.size(); }
  [[nodiscard]] std::vector<Rule> Rules() const;
  // Hands one rule after another to `visit`: a million of them take several times the memory of the
  // table.
  template <typename Visit>
  void ForEach(Visit visit) const {
    for (const Decided& decided : decided_) {
      if (decided.isHeld) visit(RuleOf(decided));
    }
  }

 private:
  // Where a decision stands in decided_.
  using Place = std::uint32_t;

  struct Decided {
    std::size_t text;    // where its words begin in text_
    std::uint32_t size;  // of them
    std::uint32_t line;
    DomainId target;
    Decision decision;
    bool isHeld = true;  // false from when it was dropped until Compact
  };

  // Places are found by the words that stand there.
  struct HashOfWords {
    const RuleTable* table;
    std::size_t operator()(std::string_view words) const {
      return std::hash<std::string_view>()(words);
    }
    std::size_t operator()(Place place) const { return (*this)(table->WordsAt(place)); }
  };
  struct SameWords {
    using is_transparent = void;
    const RuleTable* table;
    bool operator()(Place a, Place b) const { return a == b; }
    bool operator()(Place a, std::string_view b) const { return table->WordsAt(a) == b; }
    bool operator()(std::string_view a, Place b) const { return a == table->WordsAt(b); }
  };
  using Index = tsl::robin_set<Place, HashOfWords, SameWords, std::allocator<Place>, true>;
  static constexpr std::size_t kNoBuckets = 0;

  [[nodiscard]] std::string_view WordsAt(Place place) const {
    return std::string_view(text_).substr(decided_[place].text, decided_[place].size);
  }
  [[nodiscard]] Rule RuleOf(const Decided& decided) const;
  std::optional<DomainId> SetLastWords(std::size_t text, const Rule& rule);
  void Compact();

  // A rule takes no memory of its own: a load's time is that of memory, too.
  std::string text_;  // the words of all rules, each followed by a NUL
  std::vector<Decided> decided_;
  Index index_;
};

}  // namespace StandIn
