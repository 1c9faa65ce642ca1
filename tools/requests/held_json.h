// What a kernel holds, as programs read it.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <optional>

#include "host/image/image_index.h"
#include "host/module/security_module.h"

namespace SecPolicyTool {

// docs/schemas/show.schema.json: everything that `module` holds, or of the domains only the one
// with the id `domain`, which may be none. Called in the host, whose image is `image`. Throws what
// the module throws.
nlohmann::json HeldJson(StandIn::SecurityModule& module, const StandIn::ImageIndex& image,
                        const std::optional<unsigned int>& domain);

}  // namespace SecPolicyTool
