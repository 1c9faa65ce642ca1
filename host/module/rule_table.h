// The rules of one domain and kind.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "host/module/rule.h"

namespace StandIn {

// One decision for each sequence of words, in the order in which their words were first set.
// Finding and setting take constant time; reading all rules sorts them. A million rules of ordinary
// words take about 120 MB.
class RuleTable {
 public:
  // A later decision on the same words takes the earlier one's place, whose target is given back.
  // The words must hold no NUL. What throws changes nothing.
  std::optional<DomainId> Set(const Rule& rule);
  [[nodiscard]] bool Holds(const FewWords& words) const;
  // Drops the rules with this target; gives their number. Walks the whole table.
  std::size_t DropTarget(DomainId target);

  // Hands the target of each rule to `visit`, in no order.
  template <typename Visit>
  void ForEachTarget(Visit visit) const {
    for (const auto& [words, decided] : decided_) visit(decided.targetDomain);
  }

  [[nodiscard]] std::size_t Size() const { return decided_.size(); }
  [[nodiscard]] std::vector<Rule> Rules() const;

 private:
  struct Decided {
    std::uint64_t place;  // among the others: ascending as the words were first set
    std::uint32_t line;
    DomainId targetDomain;
    Decision decision;
  };

  // By their words, each followed by a NUL: one piece of memory for a rule, two when its words are
  // long. A list beside it for the order would take another, and a load's time is that of memory.
  std::unordered_map<std::string, Decided> decided_;
  std::uint64_t next_ = 0;
};

}  // namespace StandIn
