#include "tools/requests/batch_load.h"

#include <exception>

#include "secpolicy/secpolicy.h"
#include "tools/policy/error_messages.h"
#include "tools/policy/output.h"

namespace SecPolicyTool {

LoadEnd LoadInBatch(StandIn::Session& session, const std::string& dir) {
  session.BeginBatch();
  try {
    SecPolicy::LoadPolicy(dir);
  } catch (const std::exception& failure) {
    ReportError(MessageOf(failure));
    return LoadEnd::kFailed;
  }
  return LoadEnd::kDone;
}

}  // namespace SecPolicyTool
