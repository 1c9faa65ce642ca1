#include "tools/labels/descriptor_limit.h"

#include <sys/resource.h>

#include <algorithm>
#include <filesystem>

namespace SecPolicyTool {

namespace {

// More than what the command has open besides the directories.
constexpr rlim_t kOtherFiles = 64;

rlim_t LimitOfOpenFiles() {
  rlimit limit{};
  return getrlimit(RLIMIT_NOFILE, &limit) == 0 ? limit.rlim_cur : RLIM_INFINITY;
}

}  // namespace

std::string DescriptorLimitReason(std::string_view message,
                                  const std::function<bool(const std::string& dir)>& opens) {
  constexpr std::string_view kText = "Unable to open directory ";
  const std::size_t start = message.find(kText);
  if (start == std::string_view::npos) return {};
  const std::string dir(message.substr(start + kText.size()));
  const auto levels = static_cast<rlim_t>(std::count(dir.begin(), dir.end(), '/'));
  const rlim_t limit = LimitOfOpenFiles();
  if (levels + kOtherFiles < limit || !opens(dir)) return {};
  return "labelling a tree keeps a directory open for each of its levels, and the limit of open "
         "files is " +
         std::to_string(limit) + "; raise it (ulimit -n)";
}

bool OpensDirectory(const std::string& dir) {
  std::error_code error;
  const std::filesystem::directory_iterator opened(dir, error);
  return !error;
}

}  // namespace SecPolicyTool
