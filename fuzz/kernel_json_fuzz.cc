// The kept state of a module: it is refused with HostError and changes nothing, or it is taken over
// and saved as it was read the next time.
#include <cstdint>
#include <cstdlib>
#include <string>

#include "host/host_error.h"
#include "host/module/description_json.h"
#include "host/module/simulated_module.h"

namespace {

class OneProcess final : public StandIn::ProcessTable {
 public:
  StandIn::ProcessIdentity Self() const override { return {1, 1}; }
  bool Runs(const StandIn::ProcessIdentity& process) const override { return process == Self(); }
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const OneProcess processes;
  static const auto description =
      StandIn::ReadDescription(StandIn::DefaultDescriptionText(), "host.json");
  StandIn::SimulatedModule module(description, processes);
  const std::string before = module.Save();
  try {
    module.Restore(std::string(data, data + size), "kernel.json");
  } catch (const StandIn::HostError&) {
    if (module.Save() != before) std::abort();
    return 0;
  }
  const std::string saved = module.Save();
  module.Restore(saved, "kernel.json");
  if (module.Save() != saved) std::abort();
  return 0;
}
