// The description of a host: anything but a good one is refused with HostError, which names the
// file; a good one makes a module whose fresh state can be saved and restored.
#include "fuzz/support/input.h"
#include "fuzz/support/require.h"
#include "host/module/description_json.h"
#include "host/module/module_error.h"
#include "host/module/simulated_module.h"
#include "secpolicy/host/host_error.h"
#include "tests/support/memory_host.h"

namespace {

void RequireGood(const StandIn::ModuleDescription& description) {
  const SecPolicyTest::OneProcess processes;
  StandIn::SimulatedModule module(description, processes);
  Fuzz::Require(module.FindDomain("rootDom") == 0U, "the first domain is predefined");
  Fuzz::Require(module.MaxDomains() == description.limits.domains, "the limit is the host's own");
  for (const auto& [list, words] : description.words) {
    for (const std::string& word : words) module.ValidateWord(list, word);
  }
  for (const auto& [world, domain] : description.worlds) {
    Fuzz::Require(!domain.empty() && world > 0, "a world has a domain");
  }
  const std::string saved = module.Save();
  module.Restore(saved, "kernel.json");
  Fuzz::RequireEqual(module.Save(), saved, "a fresh state can be saved and restored");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  try {
    RequireGood(StandIn::ReadDescription(Fuzz::BytesOf(data, size), "host.json"));
  } catch (const StandIn::HostError& error) {
    Fuzz::Require(std::string(error.what()).starts_with("host.json:"), "the file is named");
  }
  return 0;
}
