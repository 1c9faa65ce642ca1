// Work that leaves the calling process as it is.
#pragma once

#include <functional>

#include "bindings/c/fields.h"

namespace SecPolicyC {

// Runs `work` in a forked child and returns what it returned. Throws what it threw, as Failure; and
// Failure (SECPOLICY_SYSTEM) when no child can be made, or it ended otherwise: "the work was killed
// (SIGNAL)", "the work came to no end".
//
// The child has the memory of the process and the thread that calls, and nothing else of it: the
// signal handlers are the default ones, no signal is blocked, the standard streams are /dev/null,
// and all other descriptors are closed.
//
// Another thread may be anywhere at the fork, and a variable that it was about to initialise would
// stay half made in the child. So the code of the tools, whose functions have such variables, is
// run in children alone. So are values of JSON, whose destructors need memory.
Fields InChild(const std::function<Fields()>& work);

}  // namespace SecPolicyC
