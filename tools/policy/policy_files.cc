#include "tools/policy/policy_files.h"

#include <algorithm>

#include "core/directory_stream.h"

namespace SecPolicyTool {

std::vector<std::string> PolicyFileNames(const StandIn::FileTree& tree, const std::string& dir) {
  SecPolicy::DirectoryStream directory(tree.OpenDirectory(dir));
  std::vector<std::string> names;
  if (!directory.IsOpen()) return names;
  while (auto entry = directory.Next()) {
    if (entry->type == DT_REG) names.push_back(std::move(entry->name));
  }
  std::sort(names.begin(), names.end());
  return names;
}

}  // namespace SecPolicyTool
