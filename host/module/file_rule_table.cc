#include "host/module/file_rule_table.h"

#include <limits>

namespace StandIn {

bool FileRuleTable::Holds(WorldId world, const std::string& path) const {
  return table_.Find({path, world}) != nullptr;
}

void FileRuleTable::Set(const FileRule& rule) {
  if (FileRule* const existing = table_.Find(KeyOf(rule)); existing != nullptr) {
    existing->permission = rule.permission;
  } else {
    table_.Append(rule);
  }
}

bool FileRuleTable::Remove(WorldId world, const std::string& path) {
  return table_.Erase({path, world});
}

bool FileRuleTable::Update(const std::string& path, std::uint32_t permission) {
  const std::list<WorldId> worlds = WorldsWith(path);
  for (const WorldId world : worlds) {
    table_.Find({path, world})->permission = permission;
  }
  return !worlds.empty();
}

bool FileRuleTable::Rename(const std::string& oldPath, const std::string& newPath) {
  const std::list<WorldId> worlds = WorldsWith(oldPath);
  if (oldPath == newPath) {
    return !worlds.empty();
  }
  for (const WorldId world : worlds) {
    table_.Rekey({oldPath, world}, [&newPath](FileRule& rule) { rule.path = newPath; });
  }
  return !worlds.empty();
}

std::list<WorldId> FileRuleTable::WorldsWith(const std::string& path) const {
  std::list<WorldId> worlds;
  const Index& index = table_.ByKey();
  const Key first{path, std::numeric_limits<WorldId>::min()};
  for (auto rule = index.lower_bound(first); rule != index.end() && rule->first.first == path;
       ++rule) {
    worlds.push_back(rule->first.second);
  }
  return worlds;
}

}  // namespace StandIn
