#include "tools/policy/batch_load.h"

#include "tools/policy/output.h"

namespace SecPolicyTool {

using StandIn::LoadEnd;

StandIn::LoadEnd LoadInBatch(const PolicyPath& policy, StandIn::Kernel& kernel,
                             StandIn::LibraryOutput& output) {
  kernel.BeginBatch();
  try {
    const StandIn::LibraryUse use(kernel, output, policy.MachinePath());
    return StandIn::RunLoad(policy.path);
  } catch (const std::exception& failure) {
    output.OnError(MessageOf(failure), nullptr);
    return LoadEnd::kFailed;
  }
}

}  // namespace SecPolicyTool
