#include "tools/secpolicy/host_use.h"

#include <syslog.h>

#include <limits>

#include "tools/secpolicy/host_option.h"

namespace SecPolicyTool {

std::unique_ptr<StandIn::Session> EnterHost(const std::string& dir,
                                            const StandIn::SessionOptions& options,
                                            const StandIn::ChangeOptions& changes) {
  // Before the root directory changes: the connection to the system log stays.
  openlog("secpolicy", LOG_NDELAY, LOG_USER);
  return std::make_unique<StandIn::Session>(OpenHost(dir, changes), options);
}

void ChangeHost(StandIn::Session& session, const std::function<void()>& change) {
  session.BeginBatch();
  try {
    change();
  } catch (...) {
    session.Commit();
    throw;
  }
  session.Commit();
}

int WorldId(const std::string& text) {
  using Limits = std::numeric_limits<int>;
  return static_cast<int>(WholeNumber(text, Limits::min(), Limits::max()));
}

}  // namespace SecPolicyTool
