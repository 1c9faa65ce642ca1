#include "tools/policy/trial_load.h"

#include <syslog.h>

#include <filesystem>
#include <stdexcept>

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
  if (!std::filesystem::is_directory(dir.path)) {
    throw std::runtime_error("there is no policy directory " + dir.path);
  }
  // The library logs nothing that is as urgent.
  setlogmask(LOG_MASK(LOG_EMERG));
  try {
    SecPolicy::LoadPolicy(dir.path);
  } catch (const Tavon::Lib::TavonException& failure) {
    ReportError(failure.what());
  }
}

}  // namespace SecPolicyTool
