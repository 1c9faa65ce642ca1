// What a kernel holds, as programs read it.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <optional>

#include "host/kernel/kernel.h"

namespace SecPolicyTool {

// docs/schemas/show.schema.json: everything that `kernel` holds, or of the domains only the one
// with the id `domain`, which may be none. Throws what the module throws.
nlohmann::json HeldJson(StandIn::Kernel& kernel, const std::optional<unsigned int>& domain);

}  // namespace SecPolicyTool
