#include "tools/requests/batch_load.h"

#include <exception>

#include "secpolicy/secpolicy.h"
#include "tools/policy/output.h"

namespace SecPolicyTool {

LoadEnd LoadInBatch(StandIn::Session& session, const std::string& dir) {
  session.BeginBatch();
  try {
    SecPolicy::LoadPolicy(dir);
  } catch (const std::exception& failure) {
    ReportError(failure.what());
    return LoadEnd::kFailed;
  }
  return LoadEnd::kDone;
}

}  // namespace SecPolicyTool
