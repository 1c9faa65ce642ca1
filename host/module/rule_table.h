// The rules of one domain and kind.
#pragma once

#include <list>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "host/module/rule.h"
#include "host/module/sequenced_table.h"

namespace StandIn {

// One decision for each sequence of words, in the order in which their words were first set.
// Finding and setting take constant time. A million rules of ordinary words take about 200 MB.
class RuleTable {
 public:
  // A later decision on the same words takes the earlier one's place, whose target is given back.
  // The words must hold no NUL.
  std::optional<DomainId> Set(const Rule& rule);
  [[nodiscard]] bool Holds(const std::vector<std::string>& words) const;
  // Drops the rules with this target; gives their number. Walks the whole table.
  std::size_t DropTarget(DomainId target);

  // Hands the target of each rule to `visit`.
  template <typename Visit>
  void ForEachTarget(Visit visit) const {
    for (const Stored& stored : table_.Records()) visit(stored.targetDomain);
  }

  [[nodiscard]] std::size_t Size() const { return table_.Size(); }
  [[nodiscard]] std::vector<Rule> Rules() const;

 private:
  struct Stored {
    std::string words;  // each followed by a NUL
    std::uint32_t line;
    DomainId targetDomain;
    Decision decision;
  };
  static std::string_view KeyOf(const Stored& stored) { return stored.words; }
  using Index = std::unordered_map<std::string_view, std::list<Stored>::iterator>;

  SequencedTable<Stored, Index, KeyOf> table_;
};

}  // namespace StandIn
