// The seccomp filter that turns the gate's calls into signals.
#pragma once

#include <linux/filter.h>

#include <cstdint>
#include <vector>

#include "host/gate/own_code.h"

namespace StandIn {

// The program of a filter which traps
//   the private system calls and prctl with the path option, wherever they come from;
//   setxattr and getxattr that come from `ownCode`: other code, such as a program that this process
//   turns into, makes them too and would not know what to do with the signal;
// and lets everything else by, as well as whatever is called from `passThrough` (the address behind
// the instruction). Written out by hand because libseccomp's rules cannot name the place of a call.
std::vector<sock_filter> BuildTrapFilter(const std::vector<CodeRange>& ownCode,
                                         std::uint64_t passThrough);

}  // namespace StandIn
