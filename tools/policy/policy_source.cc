#include "tools/policy/policy_source.h"

#include <utility>

#include "host/doors/library_use.h"
#include "tools/policy/held_policy.h"
#include "tools/policy/library_output.h"
#include "tools/policy/places.h"
#include "tools/policy/policy_path.h"

namespace SecPolicyTool {

using StandIn::HostDirectory;
using StandIn::Kernel;
using StandIn::LibraryUse;
using StandIn::LoadEnd;

SourcePolicy ReadSource(HostDirectory host, const std::string& source) {
  if (source == kKernelSource) return {HeldPolicy(std::move(host)), {}, false};
  const PolicyPath dir = LocatePolicy(source);
  Kernel kernel(std::move(host), {.state = StandIn::KernelOptions::State::kScratch});
  const PolicyFiles files = dir.Files(kernel);
  RequireDirectory(files);
  ErrorList errors;
  LoadEnd end{};
  {
    const LibraryUse use(kernel, errors, dir.MachinePath());
    end = StandIn::RunLoad(dir.path);
  }
  SourcePolicy read{HeldPolicy(kernel), std::move(errors.Errors()), end == LoadEnd::kTerminated};
  AddPlaces(files, kernel.Files(), read.policy);
  return read;
}

}  // namespace SecPolicyTool
