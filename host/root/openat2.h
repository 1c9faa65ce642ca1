// The system call openat2, for which the C library has no function.
#pragma once

#include <cstdint>
#include <string>

#include "host/files/unique_fd.h"

namespace StandIn {

// Opens `path` from the directory `at` with the flags of open(2), O_CLOEXEC added, and those of the
// call's own field `resolve`. Closed, with the reason in errno, when it fails: ENOSYS where there
// is no such call, as on older kernels and under emulators, which are asked once.
UniqueFd Openat2(int at, const std::string& path, int flags, std::uint64_t resolve);

}  // namespace StandIn
