// The description of a host: anything but a good one is refused with HostError.
#include <cstdint>
#include <string>

#include "host/host_error.h"
#include "host/module/description_json.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  try {
    StandIn::ReadDescription(std::string(data, data + size), "host.json");
  } catch (const StandIn::HostError&) {
    return 0;
  }
  return 0;
}
