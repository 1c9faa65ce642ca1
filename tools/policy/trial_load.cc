#include "tools/policy/trial_load.h"

#include <syslog.h>

#include "secpolicy/secpolicy.h"
#include "tools/policy/output.h"

namespace SecPolicyTool {

StandIn::SessionOptions TrialOptions(const PolicyPath& dir) {
  StandIn::SessionOptions options;
  options.visible = dir.visible;
  options.kernel = StandIn::SessionOptions::Kernel::kScratch;
  return options;
}

void LoadOnTrial(const PolicyPath& dir) {
  RequireDirectory(dir);
  // The library logs nothing that is as urgent.
  setlogmask(LOG_MASK(LOG_EMERG));
  try {
    SecPolicy::LoadPolicy(dir.path);
  } catch (const Tavon::Lib::TavonException& failure) {
    ReportError(failure.what());
  }
}

}  // namespace SecPolicyTool
