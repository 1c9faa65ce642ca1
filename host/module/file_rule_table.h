// The file rules of one domain.
#pragma once

#include <cstdint>
#include <list>
#include <map>
#include <string>
#include <string_view>
#include <utility>

#include "host/module/rule.h"
#include "host/module/sequenced_table.h"

namespace StandIn {

// One permission for each world and path, in the order in which these were first set. Everything
// takes logarithmic time in the number of rules. Judges nothing: the caller checks rules first.
class FileRuleTable {
 public:
  [[nodiscard]] std::size_t Size() const { return table_.Size(); }
  [[nodiscard]] const std::list<FileRule>& Rules() const { return table_.Records(); }
  [[nodiscard]] bool Holds(WorldId world, const std::string& path) const;

  // An existing rule of that world and path gets the new permission and keeps its place.
  void Set(const FileRule& rule);
  // These are false when no rule is concerned.
  bool Remove(WorldId world, const std::string& path);
  // For every world's rule of the path.
  bool Update(const std::string& path, std::uint32_t permission);
  // Gives every rule of the old path the new one, in its place; a rule that its world had for the
  // new path already is dropped.
  bool Rename(const std::string& oldPath, const std::string& newPath);

 private:
  using Key = std::pair<std::string_view, WorldId>;
  static Key KeyOf(const FileRule& rule) { return {rule.path, rule.world}; }
  using Index = std::map<Key, std::list<FileRule>::iterator>;

  [[nodiscard]] std::list<WorldId> WorldsWith(const std::string& path) const;

  SequencedTable<FileRule, Index, KeyOf> table_;
};

}  // namespace StandIn
