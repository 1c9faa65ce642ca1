#include "tools/secpolicy/host_use.h"

#include <limits>

#include "tools/policy/library_output.h"
#include "tools/secpolicy/host_option.h"

namespace SecPolicyTool {

using StandIn::Kernel;
using StandIn::LibraryUse;

ExitStatus ReadHost(const std::string& dir, const HostWork& work) {
  Kernel kernel(OpenHost(dir), {.state = StandIn::KernelOptions::State::kSnapshot});
  SystemLog log;
  const LibraryUse use(kernel, log);
  return work(kernel);
}

ExitStatus ChangeHost(const std::string& dir, const StandIn::ChangeOptions& changes,
                      const HostWork& work, const StandIn::KernelOptions& options) {
  Kernel kernel(OpenHost(dir, changes), options);
  SystemLog log;
  const LibraryUse use(kernel, log);
  kernel.BeginBatch();
  ExitStatus status{};
  try {
    status = work(kernel);
  } catch (...) {
    kernel.Commit();
    throw;
  }
  kernel.Commit();
  return status;
}

int WorldId(const std::string& text) {
  using Limits = std::numeric_limits<int>;
  return static_cast<int>(WholeNumber(text, Limits::min(), Limits::max()));
}

}  // namespace SecPolicyTool
