#include "tools/policy/policy_path.h"

#include <filesystem>
#include <stdexcept>

namespace SecPolicyTool {

namespace {

namespace fs = std::filesystem;

// Without "." and "..", and without a slash at its end. A link stays a link: messages are to name
// the files as their author does.
fs::path AbsolutePath(const std::string& dir) {
  const fs::path given = fs::absolute(dir);
  fs::path path = given.lexically_normal();
  if (!path.has_filename()) path = path.parent_path();
  // Behind a link, ".." leads elsewhere than the text says.
  std::error_code ignored;
  return fs::exists(given, ignored) && !fs::equivalent(given, path, ignored) ? fs::canonical(given)
                                                                             : path;
}

}  // namespace

PolicyPath LocatePolicy(const std::string& dir) {
  if (dir.empty()) return {kSystemPolicyDir, false, kSystemPolicyDir};
  PolicyPath location{AbsolutePath(dir).string(), false, dir};
  while (location.shown.size() > 1 && location.shown.ends_with('/')) location.shown.pop_back();
  std::error_code ignored;
  location.isOnMachine = fs::is_directory(location.path, ignored);
  return location;
}

void RequireDirectory(const PolicyFiles& policy) {
  if (!policy.tree.IsDirectory(policy.path)) {
    throw std::runtime_error("there is no policy directory " + policy.path);
  }
}

}  // namespace SecPolicyTool
