// The door to the kernel's own view of a path.
#pragma once

#include <string>

#include "platform/zek_access.h"

namespace SecPolicy {

// Asks the kernel to resolve `path` into the record's path. False when it cannot; the record's
// path may have been written to all the same.
[[nodiscard]] bool ResolvePath(const std::string& path, ZekAccess_FileRule& rule);

}  // namespace SecPolicy
