// How the command ends, for scripts.
#pragma once

namespace SecPolicyTool {

enum ExitStatus : int {
  kDone = 0,
  kFailed = 1,      // the policy or the request failed
  kUsage = 2,       // the command line is wrong
  kTerminated = 3,  // the load was terminated: a domain that the host needs is missing
};

}  // namespace SecPolicyTool
