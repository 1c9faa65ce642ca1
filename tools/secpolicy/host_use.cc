#include "tools/secpolicy/host_use.h"

#include <syslog.h>

#include <limits>

#include "tools/secpolicy/host_option.h"

namespace SecPolicyTool {

std::unique_ptr<StandIn::Session> EnterHost(const std::string& dir,
                                            const StandIn::SessionOptions& options) {
  // Before the root directory changes: the connection to the system log stays.
  openlog("secpolicy", LOG_NDELAY, LOG_USER);
  return std::make_unique<StandIn::Session>(OpenHost(dir), options);
}

int WorldId(const std::string& text) {
  using Limits = std::numeric_limits<int>;
  return static_cast<int>(WholeNumber(text, Limits::min(), Limits::max()));
}

}  // namespace SecPolicyTool
