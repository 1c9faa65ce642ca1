#include "tools/policy/progress_filter.h"

#include <syslog.h>

#include <string_view>

namespace SecPolicyTool {

namespace {

constexpr char kIdentity[] = "secpolicy";
constexpr std::string_view kPrefix = "secpolicy: ";
constexpr std::string_view kErrorPrefix = "secpolicy: Error: ";

}  // namespace

void OpenProgressLog() { openlog(kIdentity, LOG_NDELAY | LOG_PERROR, LOG_USER); }

bool FilterProgress(std::string& line) {
  if (line.starts_with(kErrorPrefix)) return false;
  if (line.starts_with(kPrefix)) line.erase(0, kPrefix.size());
  return true;
}

}  // namespace SecPolicyTool
