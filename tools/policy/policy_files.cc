#include "tools/policy/policy_files.h"

#include <filesystem>

#include "secpolicy/secpolicy.h"

namespace SecPolicyTool {

std::vector<std::string> PolicyFileNames(const std::string& dir) {
  std::map<std::string, std::string> files;
  try {
    SecPolicy::GetFileList(dir, files);
  } catch (const Tavon::Lib::TavonException&) {
    // A load says so; here there is nothing to be found.
  }
  std::vector<std::string> names;
  names.reserve(files.size());
  for (const auto& [path, name] : files) names.push_back(name);
  return names;
}

std::string WithoutLinks(const std::string& path) {
  std::error_code error;
  const std::filesystem::path resolved = std::filesystem::canonical(path, error);
  return error ? path : resolved.string();
}

}  // namespace SecPolicyTool
