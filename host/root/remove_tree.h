// Removal of directory trees.
#pragma once

#include <string>

#include "host/files/directory.h"

namespace StandIn {

// Removes `name` in `dir` with everything below it, if it is there. Symbolic links are removed, not
// followed; directories whose permissions forbid it are given others first; any depth is coped
// with. Throws HostError "DIR/NAME: cannot be removed: REASON" (or "read" instead of "removed");
// what is left then is still under that name.
void RemoveTree(const DirectoryRef& dir, const std::string& name);

}  // namespace StandIn
