#include "tools/policy/policy_source.h"

#include <filesystem>
#include <stdexcept>
#include <utility>

#include "tools/policy/held_policy.h"
#include "tools/policy/host_work.h"
#include "tools/policy/places.h"
#include "tools/policy/policy_json.h"
#include "tools/policy/policy_path.h"
#include "tools/policy/trial_load.h"

namespace SecPolicyTool {

using StandIn::HostDirectory;
using StandIn::Session;

SourcePolicy ReadSource(HostDirectory host, const std::string& source) {
  if (source == kKernelSource) return {HeldPolicy(host), {}, false};
  const PolicyPath dir = LocatePolicy(source);
  const StandIn::ImageIndex image = ImageOf(host);
  const HostWork outcome = WorkInHost(
      std::move(host), TrialOptions(dir), [&](Session&) { LoadOnTrial(dir); },
      [&](Session& session) {
        Policy policy = HeldPolicy(session.Module(), image);
        AddPlaces(dir.Files(), image, policy);
        return ToJson(policy);
      });
  return {PolicyOfJson(outcome.result), outcome.errors, outcome.wasTerminated};
}

}  // namespace SecPolicyTool
