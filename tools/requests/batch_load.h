// A load that is kept as a whole.
#pragma once

#include <cstdint>
#include <string>

#include "host/image/session.h"

namespace SecPolicyTool {

enum class LoadEnd : std::uint8_t { kDone, kFailed };

// LoadPolicy of `dir` in a batch of `session`, which the caller commits, also where the process is
// terminated as by LoadPolicy: a kernel keeps what was installed before. What the library throws is
// reported on standard error, and is kFailed.
LoadEnd LoadInBatch(StandIn::Session& session, const std::string& dir);

}  // namespace SecPolicyTool
